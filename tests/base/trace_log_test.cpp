// The trace log: reading "component.cfg", the level gate, and the per-thread files.
#include "TraceLog.h"

#include <gtest/gtest.h>

#include <climits>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>
#include <thread>

#include "port.h"

namespace QZScoring_800 {
namespace {

namespace fs = std::filesystem;

// Every test starts and ends without a configuration, log directory or read level.
class TraceLogTest : public ::testing::Test {
 protected:
  void SetUp() override { Clean(); }
  void TearDown() override { Clean(); }

  static void Clean() {
    std::error_code ignored;
    fs::remove("component.cfg", ignored);
    fs::remove_all(LogDirectory(), ignored);
    ResetTraceLevelForTesting();
  }

  static std::string LogDirectory() {
    return "log" + std::to_string(port::CurrentProcessId());
  }

  static std::string LogPath(long threadId) {
    return LogDirectory() + "/" + std::to_string(threadId) + "_scoring.log";
  }

  static void WriteConfig(const std::string& text) {
    std::ofstream("component.cfg", std::ios::binary) << text;
  }

  // The whole log file of a thread, or "<absent>".
  static std::string ReadLog(long threadId = port::CurrentThreadId()) {
    std::ifstream in(LogPath(threadId), std::ios::binary);
    if (!in) return "<absent>";
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
  }
};

// Blanks, tabs and form feeds go from both ends only; other characters stay.
TEST_F(TraceLogTest, TrimBlanksRemovesOnlyBlanksTabsAndFormFeedsAtTheEnds) {
  EXPECT_EQ(TrimBlanks(" \t\floglevel \f\t"), "loglevel");
  EXPECT_EQ(TrimBlanks("a b\tc"), "a b\tc");
  EXPECT_EQ(TrimBlanks(" \t\f "), "");
  EXPECT_EQ(TrimBlanks(""), "");
  EXPECT_EQ(TrimBlanks("\r2\r"), "\r2\r");
}

// Keys and values are trimmed; the key is case-sensitive; non-positive values are
// skipped; the first positive "loglevel" wins; lines without a comma are ignored.
TEST_F(TraceLogTest, ReadLogLevelTakesTheFirstPositiveLoglevel) {
  EXPECT_EQ(ReadLogLevel(), 0);  // no file

  WriteConfig("  loglevel \t,  2  \n");
  EXPECT_EQ(ReadLogLevel(), 2);

  WriteConfig("LogLevel,3\n");
  EXPECT_EQ(ReadLogLevel(), 0);

  WriteConfig("just a comment\nloglevel,0\nloglevel,-1\nother,9\nloglevel,4\n");
  EXPECT_EQ(ReadLogLevel(), 4);

  WriteConfig("loglevel,2\nloglevel,5\n");
  EXPECT_EQ(ReadLogLevel(), 2);

  WriteConfig("loglevel,7 levels\r\n");
  EXPECT_EQ(ReadLogLevel(), 7);

  WriteConfig("loglevel,many\n");
  EXPECT_EQ(ReadLogLevel(), 0);

  WriteConfig("\n\nloglevel,3");  // last line without a newline
  EXPECT_EQ(ReadLogLevel(), 3);

  WriteConfig("loglevel,99999999999999999999\n");  // clamped instead of overflowing
  EXPECT_EQ(ReadLogLevel(), INT_MAX);
}

// Only the first 63 characters of a line count. The rest of a longer line is skipped,
// never read as a line of its own, and the lines after it are still read.
TEST_F(TraceLogTest, ReadLogLevelSurvivesLongLines) {
  WriteConfig(std::string(63, '#') + "loglevel,9\nloglevel,3\n");
  EXPECT_EQ(ReadLogLevel(), 3);

  WriteConfig("loglevel,5" + std::string(200, ' ') + "\n");
  EXPECT_EQ(ReadLogLevel(), 5);

  WriteConfig(std::string(63, 'x') + "\nloglevel,6\n");  // exactly the 63 that count
  EXPECT_EQ(ReadLogLevel(), 6);

  WriteConfig(std::string(64, 'x') + "\nloglevel,8\n");  // one over: "x" is skipped
  EXPECT_EQ(ReadLogLevel(), 8);

  WriteConfig(std::string(100000, 'z'));  // a huge last line ends the file
  EXPECT_EQ(ReadLogLevel(), 0);

  WriteConfig(std::string(54, ' ') + "loglevel,1" + "\nloglevel,2\n");  // value cut off
  EXPECT_EQ(ReadLogLevel(), 2);
}

// With tracing on, a line is written to <thread id>_<file> inside log<pid>; lines
// above the level are dropped, and an empty file name writes nothing.
TEST_F(TraceLogTest, TraceLogWritesEnabledLinesToTheThreadsFile) {
  WriteConfig("loglevel,2\n");
  TraceLog("scoring.log", 2, "Enter:%s", "QZScoring_800::ScoringFactory::CreateScoringModel");
  TraceLog("scoring.log", 3, "too detailed");
  TraceLog("", 1, "nowhere");
  TraceLog(nullptr, 1, "nowhere");
  TraceLog("scoring.log", 1, "Exit :%s. Ret: %ld", "F", 260005L);
  EXPECT_EQ(ReadLog(),
            "Enter:QZScoring_800::ScoringFactory::CreateScoringModel\n"
            "Exit :F. Ret: 260005\n");
  EXPECT_EQ(MakeLogDirectory(), LogDirectory());  // existing directory is no error

  // At level 1 the library's level-2 lines are not written.
  fs::remove_all(LogDirectory());
  WriteConfig("loglevel,1\n");
  ResetTraceLevelForTesting();
  TraceLog("scoring.log", 2, "Enter:%s", "x");
  EXPECT_EQ(ReadLog(), "<absent>");
}

// The level is read once: a configuration created after the first call does not
// switch tracing on, and one removed after it switches tracing off at once.
TEST_F(TraceLogTest, LevelIsReadOnceButRemovingTheFileStopsTracing) {
  TraceLog("scoring.log", 2, "before");
  WriteConfig("loglevel,2\n");
  TraceLog("scoring.log", 2, "still off");
  EXPECT_EQ(ReadLog(), "<absent>");

  ResetTraceLevelForTesting();
  TraceLog("scoring.log", 2, "on");
  fs::remove("component.cfg");
  TraceLog("scoring.log", 2, "after removal");
  WriteConfig("loglevel,1\n");  // not re-read: level 2 still applies
  TraceLog("scoring.log", 2, "back");
  EXPECT_EQ(ReadLog(), "on\nback\n");
}

// Messages are cut at 10,239 characters; WriteLogLine applies the same gate.
TEST_F(TraceLogTest, LongMessagesAreCutAndWriteLogLineHonoursTheLevel) {
  WriteConfig("loglevel,2\n");
  const std::string longText(20000, 'm');
  TraceLog("scoring.log", 2, "%s", longText.c_str());
  EXPECT_EQ(ReadLog(), std::string(10239, 'm') + "\n");

  fs::remove(LogPath(port::CurrentThreadId()));
  WriteLogLine("scoring.log", 3, "above the level");
  WriteLogLine("scoring.log", 2, "direct");
  WriteLogLine("scoring.log", 2, nullptr);
  EXPECT_EQ(ReadLog(), "direct\n\n");
}

// Each thread writes its own file, named by its thread id.
TEST_F(TraceLogTest, EachThreadWritesItsOwnFile) {
  WriteConfig("loglevel,2\n");
  TraceLog("scoring.log", 2, "main");
  long otherId = 0;
  std::thread other([&otherId] {
    otherId = port::CurrentThreadId();
    TraceLog("scoring.log", 2, "other");
  });
  other.join();
  ASSERT_NE(otherId, port::CurrentThreadId());
  EXPECT_EQ(ReadLog(), "main\n");
  EXPECT_EQ(ReadLog(otherId), "other\n");
}

}  // namespace
}  // namespace QZScoring_800
