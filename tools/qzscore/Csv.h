// Reading and writing CSV text (RFC 4180): quoted fields with embedded separators,
// quotes and line breaks, a UTF-8 byte-order mark, CRLF or LF line ends, and a last
// record without a line end. Memory per record is bounded, so a hostile file (an
// unterminated quote over gigabytes) fails with an error instead of exhausting memory.
#ifndef QZSCORE_CSV_H_
#define QZSCORE_CSV_H_

#include <cstddef>
#include <cstdint>
#include <istream>
#include <string>
#include <string_view>
#include <vector>

namespace qzscore {

// Reads records one at a time from a stream it does not own; the stream must outlive
// the reader. Not thread-safe. Never throws except std::bad_alloc.
class CsvReader {
 public:
  enum class Result { kRecord, kEnd, kError };

  // Largest record accepted, counted in bytes of its fields plus one per field.
  static constexpr size_t kDefaultMaxRecordBytes = size_t{16} << 20;

  explicit CsvReader(std::istream& in, char separator = ',',
                     size_t maxRecordBytes = kDefaultMaxRecordBytes);
  CsvReader(const CsvReader&) = delete;
  CsvReader& operator=(const CsvReader&) = delete;

  // kRecord: fields holds the next record's fields (the vector and its strings are
  // reused, so pass the same vector each time to avoid allocations). kEnd: no more
  // records. kError: the input is malformed or too large; GetError says why, and every
  // later call returns kError again.
  Result Next(std::vector<std::string>& fields);

  // The line on which the last record (or the failing one) began; lines count from 1.
  uint64_t GetLine() const { return recordLine_; }
  // Whether the last record was an empty line (one empty, unquoted field).
  bool WasBlankLine() const { return blank_; }
  // Bytes consumed from the stream so far (read ahead in blocks).
  uint64_t GetBytesRead() const { return bytesRead_; }
  // Why the last call returned kError; empty otherwise.
  const std::string& GetError() const { return error_; }

 private:
  bool Fill();
  int Peek();
  bool Fail(std::string message);
  bool ReadQuoted(std::string& field, size_t& recordBytes);
  bool ReadPlain(std::string& field, size_t& recordBytes);
  bool Grow(size_t& recordBytes, size_t more);

  std::istream& in_;
  char separator_;
  size_t maxRecordBytes_;
  std::vector<char> buffer_;
  size_t pos_ = 0;
  size_t end_ = 0;
  bool atStart_ = true;
  bool eof_ = false;
  bool failed_ = false;
  bool blank_ = false;
  uint64_t line_ = 1;
  uint64_t recordLine_ = 0;
  uint64_t bytesRead_ = 0;
  std::string error_;
};

// Appends field to out as one CSV field: quoted (with doubled quotes) when it holds the
// separator, a quote or a line break, as it is otherwise.
void AppendCsvField(std::string& out, std::string_view field, char separator);

// Appends the fields as one record ending in a line feed.
void AppendCsvRecord(std::string& out, const std::vector<std::string>& fields, char separator);

// Splits one line of text (no line breaks expected) into CSV fields; used for option
// values such as column lists and split keys. False for malformed text.
bool SplitCsvText(const std::string& text, std::vector<std::string>& fields, char separator = ',');

}  // namespace qzscore

#endif  // QZSCORE_CSV_H_
