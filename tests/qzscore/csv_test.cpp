// The CSV reader and writer of qzscore: RFC 4180 quoting, line ends, the byte-order
// mark, line numbers, and bounded memory on hostile input.

#include "Csv.h"

#include <gtest/gtest.h>

#include <sstream>
#include <string>
#include <vector>

using qzscore::CsvReader;
using Records = std::vector<std::vector<std::string>>;

namespace {

// Every record of text, and the reader's state after the last call.
Records ReadAll(const std::string& text, char separator = ',', std::string* error = nullptr,
                std::vector<uint64_t>* lines = nullptr,
                size_t limit = CsvReader::kDefaultMaxRecordBytes) {
  std::istringstream in(text);
  CsvReader reader(in, separator, limit);
  Records records;
  std::vector<std::string> fields;
  CsvReader::Result result;
  while ((result = reader.Next(fields)) == CsvReader::Result::kRecord) {
    records.push_back(fields);
    if (lines != nullptr) lines->push_back(reader.GetLine());
  }
  if (error != nullptr) *error = result == CsvReader::Result::kError ? reader.GetError() : "";
  if (result == CsvReader::Result::kError && lines != nullptr) lines->push_back(reader.GetLine());
  return records;
}

}  // namespace

// Quoted fields hold separators, doubled quotes and line breaks; CRLF, a lone CR and
// a missing final line end all end a record; a UTF-8 byte-order mark is skipped.
TEST(CsvReader, ReadsRfc4180Records) {
  const struct {
    const char* name;
    std::string text;
    char separator;
    Records expected;
  } cases[] = {
      {"plain", "a,b\n1,2\n", ',', {{"a", "b"}, {"1", "2"}}},
      {"no final line end", "a,b\n1,2", ',', {{"a", "b"}, {"1", "2"}}},
      {"CRLF", "a,b\r\n1,2\r\n", ',', {{"a", "b"}, {"1", "2"}}},
      {"lone CR", "a,b\r1,2", ',', {{"a", "b"}, {"1", "2"}}},
      {"byte-order mark",
       "\xEF\xBB\xBF"
       "a,b\n1,2\n",
       ',',
       {{"a", "b"}, {"1", "2"}}},
      {"quoted", "\"a,b\",\"say \"\"hi\"\"\",\"x\r\ny\"\n", ',', {{"a,b", "say \"hi\"", "x\r\ny"}}},
      {"empty fields", ",,\n\"\",x,\n", ',', {{"", "", ""}, {"", "x", ""}}},
      {"text after a closing quote", "\"ab\"cd,e\n", ',', {{"abcd", "e"}}},
      {"quote inside plain text", "a\"b,c\n", ',', {{"a\"b", "c"}}},
      {"semicolon", "a;\"b;c\"\n", ';', {{"a", "b;c"}}},
      {"tab", "a\tb,c\n", '\t', {{"a", "b,c"}}},
      {"blank line", "a\n\nb\n", ',', {{"a"}, {""}, {"b"}}},
  };
  for (const auto& c : cases) {
    std::string error;
    EXPECT_EQ(ReadAll(c.text, c.separator, &error), c.expected) << c.name;
    EXPECT_EQ(error, "") << c.name;
  }
}

// Each record reports the line it began on, counting line breaks inside quotes; an
// empty line is flagged so that hosts can skip it.
TEST(CsvReader, ReportsLinesAndBlankLines) {
  std::vector<uint64_t> lines;
  ReadAll("h\n\"x\ny\"\n\nz", ',', nullptr, &lines);
  EXPECT_EQ(lines, (std::vector<uint64_t>{1, 2, 4, 5}));

  std::istringstream in("a\n\n\"\"\n");
  CsvReader reader(in);
  std::vector<std::string> fields;
  std::vector<bool> blanks;
  while (reader.Next(fields) == CsvReader::Result::kRecord) blanks.push_back(reader.WasBlankLine());
  EXPECT_EQ(blanks, (std::vector<bool>{false, true, false}));
}

// Fields longer than the read block, with doubled quotes and line ends on the block
// boundaries, come through whole.
TEST(CsvReader, ReadsFieldsAcrossBlocks) {
  std::string big;
  for (int i = 0; i < 70000; ++i) big += i % 7 == 0 ? "\"\"" : i % 11 == 0 ? "\r\n" : "x";
  std::string expected;
  for (int i = 0; i < 70000; ++i) expected += i % 7 == 0 ? "\"" : i % 11 == 0 ? "\r\n" : "x";
  const std::string plain(200000, 'p');
  const Records records = ReadAll("\"" + big + "\"," + plain + "\r\nend", ',');
  ASSERT_EQ(records.size(), 2u);
  EXPECT_EQ(records[0], (std::vector<std::string>{expected, plain}));
  EXPECT_EQ(records[1], (std::vector<std::string>{"end"}));
}

// Malformed and oversized input fails with a reason and the record's first line, and
// stays failed; memory is bounded by the record limit, including for a line of
// separators alone.
TEST(CsvReader, RefusesUnterminatedAndOversizedRecords) {
  std::string error;
  std::vector<uint64_t> lines;
  EXPECT_EQ(ReadAll("a\nb\n\"open\nmore", ',', &error, &lines).size(), 2u);
  EXPECT_EQ(error, "the quoted field opened on line 3 never ends");
  EXPECT_EQ(lines.back(), 3u);

  lines.clear();
  ReadAll("ok\n\"" + std::string(5000, 'x'), ',', &error, &lines, 1024);
  EXPECT_EQ(error, "the record is larger than 1024 bytes (an unterminated quote?)");
  EXPECT_EQ(lines.back(), 2u);

  ReadAll(std::string(100000, ','), ',', &error, nullptr, 1 << 20);
  EXPECT_EQ(error, "the record is larger than 1 MiB (an unterminated quote?)");

  std::istringstream in("\"never closed");
  CsvReader reader(in);
  std::vector<std::string> fields;
  EXPECT_EQ(reader.Next(fields), CsvReader::Result::kError);
  EXPECT_EQ(reader.Next(fields), CsvReader::Result::kError);
}

// What the writer quotes reads back as the same fields; what needs no quotes is
// written as it is.
TEST(CsvWriter, RoundTripsThroughTheReader) {
  const std::vector<std::string> fields = {"plain", "a,b", "say \"hi\"", "x\r\ny", "", " lead"};
  std::string text;
  qzscore::AppendCsvRecord(text, fields, ',');
  EXPECT_EQ(text, "plain,\"a,b\",\"say \"\"hi\"\"\",\"x\r\ny\",, lead\n");
  EXPECT_EQ(ReadAll(text), Records{fields});

  text.clear();
  qzscore::AppendCsvRecord(text, {"a;b", "c,d"}, ';');
  EXPECT_EQ(text, "\"a;b\";c,d\n");

  std::vector<std::string> split;
  EXPECT_TRUE(qzscore::SplitCsvText("north,\"a,b\"", split));
  EXPECT_EQ(split, (std::vector<std::string>{"north", "a,b"}));
  EXPECT_FALSE(qzscore::SplitCsvText("a\nb", split));
  EXPECT_FALSE(qzscore::SplitCsvText("", split));
}
