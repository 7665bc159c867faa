// qzscore end to end: the built program run on the examples and on tricky CSV, its
// outputs, exit statuses and messages. House prices are scored by the example plug-in
// (prediction = 50000 + 1200 area - 850 age), the split examples by QZRegression.

#include <gtest/gtest.h>
#include <sys/wait.h>

#include <algorithm>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

namespace {

struct Result {
  int status = -1;
  std::string out;
  std::string err;
};

std::string TestsDir() {
  const std::string data = QZ_TEST_DATA_DIR;
  return data.substr(0, data.find_last_of('/'));
}

std::string Example(const std::string& path) { return TestsDir() + "/../examples/" + path; }

std::string Read(const std::string& path) {
  std::ifstream in(path, std::ios::binary);
  std::ostringstream text;
  text << in.rdbuf();
  return text.str();
}

void Write(const std::string& path, const std::string& text) {
  std::ofstream(path, std::ios::binary) << text;
}

// Runs qzscore with the arguments (a shell command line) in the test's scratch folder.
Result Qz(const std::string& args) {
  const std::string command = "'" + std::string(QZ_TEST_LIB_DIR) + "/../bin/qzscore' " + args +
                              " > qz_out.txt 2> qz_err.txt";
  const int raw = std::system(command.c_str());
  Result result;
  result.status = WIFEXITED(raw) ? WEXITSTATUS(raw) : -1;
  result.out = Read("qz_out.txt");
  result.err = Read("qz_err.txt");
  return result;
}

bool PluginBuilt(const std::string& plugin) {
  return std::ifstream(std::string(QZ_TEST_LIB_DIR) + "/" + plugin + "800r.dll").good();
}

const std::string kHouse =
    "--plugin RegressionModel=QZExampleRegression '" + Example("data/house_price.pmml") + "'";

}  // namespace

// Quoted fields with separators, quotes and line breaks, a byte-order mark, CRLF and a
// missing final line end are read as RFC 4180 says and written back quoted; the
// separator option applies to input and output; standard input and -o work.
TEST(QzScore, ScoresTrickyCsv) {
  Write("tricky.csv",
        "\xEF\xBB\xBF"
        "id,area,age,note\r\n"
        "1,85,12,\"a, \"\"quoted\"\"\r\nnote\"\r\n"
        "2,120,3,plain\r\n"
        "\r\n"
        "3,64,40,");
  Result r = Qz("score " + kHouse + " tricky.csv");
  EXPECT_EQ(r.status, 0) << r.err;
  EXPECT_EQ(r.out,
            "id,area,age,note,prediction\n"
            "1,85,12,\"a, \"\"quoted\"\"\r\nnote\",141800\n"
            "2,120,3,plain,191450\n"
            "3,64,40,,92800\n");
  EXPECT_NE(r.err.find("tricky.csv: 3 records read, 3 scored, 0 failed in "), std::string::npos)
      << r.err;

  Write("semicolons.csv", "area;age;\"n;b\"\n85;12;\"x;y\"\n");
  r = Qz("score " + kHouse +
         " - --separator ';' --keep-input 'n;b,age' -o out.csv -q < semicolons.csv");
  EXPECT_EQ(r.status, 0) << r.err;
  EXPECT_EQ(r.out + r.err, "");
  EXPECT_EQ(Read("out.csv"), "\"n;b\";age;prediction\n\"x;y\";12;141800\n");
}

// A cell that is not a number becomes missing and is counted; a row with the wrong
// number of cells is written with empty outputs and fails; --missing tokens are
// missing; --fail-fast stops after the first failed row.
TEST(QzScore, CountsBadRowsAndKeepsThem) {
  Write("bad.csv", "area,age\n85,abc\n1,2,3\nNA,12\n120,3\n");
  Result r = Qz("score " + kHouse + " bad.csv --missing NA");
  EXPECT_EQ(r.status, 1);
  EXPECT_EQ(r.out, "area,age,prediction\n85,abc,\n1,2,\nNA,12,\n120,3,191450\n");
  for (const char* line :
       {"qzscore: bad.csv, row 1 (line 2): column 'age': 'abc' is not a number; read as missing\n",
        "qzscore: bad.csv, row 2 (line 3): 3 cells where the header has 2; not scored\n",
        "qzscore: bad.csv: 4 records read, 3 scored, 1 failed (1 x wrong number of cells), "
        "1 cells not a number (read as missing) in "}) {
    EXPECT_NE(r.err.find(line), std::string::npos) << line << "\n" << r.err;
  }
  r = Qz("score " + kHouse + " bad.csv --fail-fast --threads 2");
  EXPECT_EQ(r.status, 1);
  EXPECT_EQ(r.out, "area,age,prediction\n85,abc,\n1,2,\n");
  EXPECT_NE(r.err.find("stopped at the first failed record"), std::string::npos) << r.err;
}

// Several documents: side by side under model IDs (outputs FIELD.ID), or one per value
// of a split field; a record whose split value has no document fails with the status
// code's text.
TEST(QzScore, CombinesDocuments) {
  const std::string north = " --model north='" + Example("split/north.pmml") + "'";
  const std::string south = " --model south='" + Example("split/south.pmml") + "'";
  Write("regions.csv", "id,region,area,age\nh1,north,85,12\nh2,south,120,3\nh3,east,64,40\n");
  Result r = Qz("score" + north + south + " regions.csv --keep-input id");
  EXPECT_EQ(r.status, 0) << r.err;
  EXPECT_EQ(r.out,
            "id,prediction.north,prediction.south\nh1,145100,119750\nh2,189900,157500\n"
            "h3,102400,85800\n");

  r = Qz("score --split-field region" + north + south + " regions.csv --keep-input id");
  EXPECT_EQ(r.status, 1);
  EXPECT_EQ(r.out, "id,prediction\nh1,145100\nh2,157500\nh3,\n");
  EXPECT_NE(r.err.find("regions.csv, row 3 (line 4): scoring failed: 260009: the model has no "
                       "scorer, or no sub-model matches the record's split-field values"),
            std::string::npos)
      << r.err;
}

// Scoring threads each hold a model; the output keeps the input order and the counts
// do not depend on the number of threads.
TEST(QzScore, ThreadsKeepInputOrder) {
  std::string input = "area,age\n";
  for (int i = 0; i < 20000; ++i) {
    input +=
        i % 997 == 0 ? "1,2,3\n" : std::to_string(i % 300) + "," + std::to_string(i % 70) + "\n";
  }
  Write("many.csv", input);
  const Result one = Qz("score " + kHouse + " many.csv --threads 1");
  const Result four = Qz("score " + kHouse + " many.csv --threads 4");
  EXPECT_EQ(one.status, 1);
  EXPECT_EQ(four.status, 1);
  EXPECT_EQ(std::count(one.out.begin(), one.out.end(), '\n'), 20001);
  EXPECT_EQ(one.out, four.out);
  EXPECT_NE(four.err.find("20000 records read, 19979 scored, 21 failed"), std::string::npos)
      << four.err;
}

// Bad usage, an unreadable or unscorable model, a broken registry and malformed input
// each give exit status 2 and one line naming the file, the row and what is wrong.
TEST(QzScore, RefusesWithOneClearLine) {
  Write("houses.csv", "area,age\n85,12\n");
  Write("open.csv", "area,age\n85,12\n\"1,2\n");
  Write("empty.csv", "");
  Write("notxml.pmml", "area,age\n");
  Write("nothing.txt", "# nothing that scores regressions\nTreeModel = QZTestEcho\n");
  Write("missing.txt", "TreeModel = QZTestEcho\nRegressionModel = QZNothing\n");
  const std::string house = Example("data/house_price.pmml");
  const struct {
    std::string args;
    std::string message;
  } cases[] = {
      {"score nosuch.pmml houses.csv", "nosuch.pmml: cannot open the model file: No such file"},
      {"score notxml.pmml houses.csv",
       "notxml.pmml: 260007: the file is not a complete PMML document"},
      {"score --registry nothing.txt " + house + " houses.csv",
       "house_price.pmml: cannot create the model: 260010: no scorer could be obtained for the "
       "document (is a plug-in registered for RegressionModel?)"},
      {"score --registry missing.txt " + house + " houses.csv",
       "missing.txt:2: plug-in QZNothing cannot be loaded: QZNothing800r.dll: cannot open"},
      {"score " + kHouse + " empty.csv", "empty.csv: the input is empty"},
      {"score " + kHouse + " nosuch.csv", "nosuch.csv: cannot open: No such file"},
      {"score " + kHouse + " houses.csv --keep-input x",
       "--keep-input: the input has no column 'x'"},
      {"score --split-field region " + house, "--split-field needs --model KEY=FILE"},
      {"score --model a " + house, "--model a: expected ID=FILE"},
      {"score " + kHouse + " houses.csv --separator '\"'",
       "--separator \": expected one character"},
      {"verify " + kHouse + " houses.csv", "houses.csv: no column holds expected results"},
      {"score " + kHouse + " houses.csv --threads 0", "--threads"},
  };
  for (const auto& c : cases) {
    const Result r = Qz(c.args);
    EXPECT_EQ(r.status, 2) << c.args;
    EXPECT_EQ(r.err.rfind("qzscore: ", 0), 0u) << r.err;
    EXPECT_NE(r.err.find(c.message), std::string::npos) << c.args << "\n" << r.err;
    EXPECT_EQ(std::count(r.err.begin(), r.err.end(), '\n'), 1) << r.err;
    EXPECT_EQ(r.out, "") << c.args;
  }
  // Input that turns out malformed midway: the records before it are written.
  const Result r = Qz("score " + kHouse + " open.csv");
  EXPECT_EQ(r.status, 2);
  EXPECT_EQ(r.out, "area,age,prediction\n85,12,141800\n");
  EXPECT_EQ(r.err.rfind(
                "qzscore: open.csv, row 2 (line 3): the quoted field opened on line 3 never ends\n"
                "qzscore: open.csv: 1 records read, 1 scored",
                0),
            0u)
      << r.err;
}

// inspect shows what the scan and the data dictionary give: flags, missing values,
// the adjusted-propensity extension, derived fields; --json holds the same.
TEST(QzInspect, DescribesTheExamples) {
  Result r = Qz("inspect '" + Example("propensity/response.pmml") + "'");
  EXPECT_EQ(r.status, 0) << r.err;
  for (const char* part :
       {"  model element              TreeModel (model type 13)\n",
        "  targets                    respond\n", "  adjusted propensity        yes\n",
        "visits   input   continuous   integer  missing -1\n",
        "categories N, Y; binary flag, true category Y; flag measure\n"}) {
    EXPECT_NE(r.out.find(part), std::string::npos) << part << "\n" << r.out;
  }
  r = Qz("inspect --json '" + Example("transformations/prepare.pmml") + "'");
  EXPECT_EQ(r.status, 0) << r.err;
  for (const char* part : {"\"modelType\": 16", "\"transformationDictionary\": true",
                           "\"builtIn\": \"transformations\"", "\"name\": \"age_band\"",
                           "\"categories\": [\n        \"north\",\n        \"south\""}) {
    EXPECT_NE(r.out.find(part), std::string::npos) << part << "\n" << r.out;
  }
}

// verify agrees on the regression example and names the record and column that
// disagree; a transformations-only document's derived fields are its output.
TEST(QzVerify, ComparesExpectedColumnsAndScoresTheExamples) {
  const std::string model = "'" + Example("regression/subscription.pmml") + "' ";
  Result r = Qz("verify " + model + "'" + Example("regression/customers_expected.csv") + "'");
  EXPECT_EQ(r.status, 0) << r.err << r.out;
  EXPECT_NE(r.out.find("4 records, 0 with an unexpected status; all agree"), std::string::npos)
      << r.out;

  std::string changed = Read(Example("regression/customers_expected.csv"));
  changed.replace(changed.find("premium,yes,0.78"), 16, "premium,no,0.77");
  Write("changed.csv", changed);
  r = Qz("verify " + model + "changed.csv");
  EXPECT_EQ(r.status, 1);
  EXPECT_NE(r.err.find("changed.csv, row 1 (line 2): prediction: got 'yes', expected 'no'"),
            std::string::npos)
      << r.err;
  EXPECT_NE(r.out.find("DISAGREEMENT"), std::string::npos) << r.out;

  r = Qz("score '" + Example("transformations/prepare.pmml") + "' '" +
         Example("transformations/people.csv") + "' --keep-input name");
  EXPECT_EQ(r.status, 0) << r.err;
  EXPECT_EQ(r.out,
            "name,transformations.income_k,transformations.age_band,"
            "transformations.age_scaled,transformations.region_code\n"
            "Ann,52,middle,0.34,1\nBob,38.5,young,0.19,3\nCyd,91,senior,0.67,2\n"
            "Dee,,middle,0.45,0\n");
}

// The tree, ensemble and propensity examples agree with their expected results when
// the reference plug-ins are built.
TEST(QzVerify, ExamplesAgreeWithTheReferencePlugins) {
  if (!PluginBuilt("QZTree") || !PluginBuilt("QZMining")) {
    GTEST_SKIP() << "QZTree or QZMining is not built";
  }
  for (const char* example : {"tree/iris_tree.pmml tree/iris_expected.csv",
                              "ensemble/iris_vote.pmml ensemble/iris_expected.csv",
                              "propensity/response.pmml propensity/customers_expected.csv"}) {
    std::istringstream paths(example);
    std::string pmml, expected;
    paths >> pmml >> expected;
    const Result r = Qz("verify '" + Example(pmml) + "' '" + Example(expected) + "'");
    EXPECT_EQ(r.status, 0) << example << "\n" << r.out << r.err;
  }
}

// Every subcommand has help with examples; without a subcommand the usage goes to
// standard error with status 2; plugins lists the registry and whether each loads.
TEST(QzHelp, ListsCommandsExamplesAndPlugins) {
  for (const std::string command : {"score", "inspect", "verify", "plugins"}) {
    const Result r = Qz(command + " --help");
    EXPECT_EQ(r.status, 0) << command;
    EXPECT_NE(r.out.find("Examples:\n  qzscore " + command), std::string::npos) << r.out;
  }
  Result r = Qz("");
  EXPECT_EQ(r.status, 2);
  EXPECT_NE(r.err.find("Subcommands:"), std::string::npos) << r.err;

  Write("echo.txt", "TreeModel = QZTestEcho\n");
  r = Qz("plugins --registry echo.txt --plugin Veritor=QZTestSettings");
  EXPECT_EQ(r.status, 0) << r.err;
  EXPECT_NE(
      r.out.find("TreeModel          QZTestEcho             QZTestEcho800r.dll           loads\n"
                 "Veritor            QZTestSettings         QZTestSettings800r.dll       loads\n"),
      std::string::npos)
      << r.out;
}
