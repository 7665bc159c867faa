// The CSV reader of qzscore on arbitrary bytes, with a separator and a record-size
// limit picked by the first byte. Every record read is written back with
// AppendCsvRecord and must read back unchanged; SplitCsvText must agree with the
// reader on a single line.
#include <sstream>
#include <string>
#include <vector>

#include "Csv.h"
#include "FuzzSupport.h"

using qzscore::CsvReader;

namespace {

std::string Join(const std::vector<std::string>& fields) {
  std::string out;
  for (const auto& f : fields) out += "[" + f + "]";
  return out;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size < 1) return 0;
  static const char kSeparators[] = {',', ';', '\t', '|'};
  const char separator = kSeparators[data[0] % 4];
  const size_t limit = (data[0] & 4) ? 64 : CsvReader::kDefaultMaxRecordBytes;
  const std::string text(reinterpret_cast<const char*>(data) + 1, size - 1);

  std::istringstream in(text);
  CsvReader reader(in, separator, limit);
  std::vector<std::vector<std::string>> records;
  std::vector<std::string> fields;
  CsvReader::Result result;
  uint64_t lastLine = 0;
  while ((result = reader.Next(fields)) == CsvReader::Result::kRecord) {
    if (reader.GetLine() < lastLine) qzfuzz::Fail("record lines go backwards");
    lastLine = reader.GetLine();
    if (fields.empty()) qzfuzz::Fail("a record without fields");
    if (reader.WasBlankLine() && !(fields.size() == 1 && fields[0].empty())) {
      qzfuzz::Fail("a blank line with content");
    }
    records.push_back(fields);
    if (records.size() > 100000) qzfuzz::Fail("more records than bytes");
  }
  if (reader.Next(fields) != result) qzfuzz::Fail("the reader did not stay at its end");
  if (reader.GetBytesRead() > text.size()) qzfuzz::Fail("more bytes read than given");

  // Write back what was read (after a byte-order mark, so that a first field that
  // starts with one keeps it) and read it again.
  std::string written = "\xEF\xBB\xBF";
  for (const auto& record : records) qzscore::AppendCsvRecord(written, record, separator);
  std::istringstream again(written);
  CsvReader rereader(again, separator, CsvReader::kDefaultMaxRecordBytes);
  for (const auto& record : records) {
    if (rereader.Next(fields) != CsvReader::Result::kRecord) {
      qzfuzz::Fail("a written record does not read back", rereader.GetError());
    }
    if (fields != record) {
      qzfuzz::Fail("a written record reads back changed", Join(record) + " -> " + Join(fields));
    }
  }
  if (rereader.Next(fields) != CsvReader::Result::kEnd) {
    qzfuzz::Fail("writing added records");
  }

  // One line of text: SplitCsvText agrees with the reader where both accept it.
  const std::string line = text.substr(0, text.find_first_of("\r\n"));
  std::vector<std::string> split;
  if (qzscore::SplitCsvText(line, split, separator)) {
    std::istringstream one(line);
    CsvReader lineReader(one, separator);
    std::vector<std::string> read;
    if (!line.empty() && line.rfind("\xEF\xBB\xBF", 0) != 0 &&
        lineReader.Next(read) == CsvReader::Result::kRecord && read != split) {
      qzfuzz::Fail("SplitCsvText and the reader disagree", Join(split) + " vs " + Join(read));
    }
  }
  return 0;
}
