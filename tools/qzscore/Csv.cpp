#include "Csv.h"

#include <sstream>
#include <utility>

namespace qzscore {

namespace {

constexpr size_t kBlockSize = size_t{1} << 16;
// What one field costs besides its text (its string object), counted against the
// record limit so that a line of separators alone cannot exhaust memory either.
constexpr size_t kFieldOverhead = sizeof(std::string);

std::string SizeText(size_t bytes) {
  if (bytes >= (size_t{1} << 20) && bytes % (size_t{1} << 20) == 0) {
    return std::to_string(bytes >> 20) + " MiB";
  }
  return std::to_string(bytes) + " bytes";
}

}  // namespace

CsvReader::CsvReader(std::istream& in, char separator, size_t maxRecordBytes)
    : in_(in), separator_(separator), maxRecordBytes_(maxRecordBytes), buffer_(kBlockSize) {}

bool CsvReader::Fill() {
  if (eof_) return false;
  std::streambuf* source = in_.rdbuf();
  const std::streamsize got =
      source == nullptr
          ? 0
          : source->sgetn(buffer_.data(), static_cast<std::streamsize>(buffer_.size()));
  pos_ = 0;
  end_ = got > 0 ? static_cast<size_t>(got) : 0;
  bytesRead_ += end_;
  if (end_ == 0) eof_ = true;
  return end_ != 0;
}

int CsvReader::Peek() {
  if (pos_ == end_ && !Fill()) return -1;
  return static_cast<unsigned char>(buffer_[pos_]);
}

bool CsvReader::Fail(std::string message) {
  error_ = std::move(message);
  failed_ = true;
  return false;
}

bool CsvReader::Grow(size_t& recordBytes, size_t more) {
  recordBytes += more;
  if (recordBytes <= maxRecordBytes_) return true;
  return Fail("the record is larger than " + SizeText(maxRecordBytes_) +
              " (an unterminated quote?)");
}

// Unquoted text up to the next separator or line end. A quote inside it is taken as
// an ordinary character, as most writers of CSV expect.
bool CsvReader::ReadPlain(std::string& field, size_t& recordBytes) {
  for (;;) {
    if (pos_ == end_ && !Fill()) return true;
    const size_t start = pos_;
    while (pos_ < end_) {
      const char c = buffer_[pos_];
      if (c == separator_ || c == '\n' || c == '\r') break;
      ++pos_;
    }
    if (!Grow(recordBytes, pos_ - start)) return false;
    field.append(buffer_.data() + start, pos_ - start);
    if (pos_ < end_) return true;
  }
}

// A quoted field: doubled quotes stand for one quote; separators and line breaks are
// part of the text. Text between the closing quote and the next separator is appended
// as it is.
bool CsvReader::ReadQuoted(std::string& field, size_t& recordBytes) {
  const uint64_t openedOn = line_;
  ++pos_;  // the opening quote
  for (;;) {
    if (pos_ == end_ && !Fill()) {
      return Fail("the quoted field opened on line " + std::to_string(openedOn) + " never ends");
    }
    const size_t start = pos_;
    while (pos_ < end_ && buffer_[pos_] != '"') {
      if (buffer_[pos_] == '\n') ++line_;
      ++pos_;
    }
    if (!Grow(recordBytes, pos_ - start)) return false;
    field.append(buffer_.data() + start, pos_ - start);
    if (pos_ == end_) continue;
    ++pos_;  // a quote: doubled, or the closing one
    if (Peek() == '"') {
      if (!Grow(recordBytes, 1)) return false;
      field.push_back('"');
      ++pos_;
      continue;
    }
    return ReadPlain(field, recordBytes);
  }
}

CsvReader::Result CsvReader::Next(std::vector<std::string>& fields) {
  blank_ = false;
  if (failed_) return Result::kError;
  if (atStart_) {
    atStart_ = false;
    if (Peek() == 0xEF && end_ - pos_ >= 3 && buffer_[pos_ + 1] == '\xBB' &&
        buffer_[pos_ + 2] == '\xBF') {
      pos_ += 3;
    }
  }
  if (Peek() < 0) return Result::kEnd;
  recordLine_ = line_;
  size_t count = 0;
  size_t recordBytes = 0;
  bool quoted = false;
  for (;;) {
    if (count == fields.size()) fields.emplace_back();
    std::string& field = fields[count++];
    field.clear();
    if (!Grow(recordBytes, kFieldOverhead)) return Result::kError;
    if (Peek() == '"') {
      quoted = true;
      if (!ReadQuoted(field, recordBytes)) return Result::kError;
    } else if (!ReadPlain(field, recordBytes)) {
      return Result::kError;
    }
    const int c = Peek();
    if (c == static_cast<unsigned char>(separator_)) {
      ++pos_;
      continue;
    }
    if (c == '\r') {
      ++pos_;
      if (Peek() == '\n') ++pos_;
      ++line_;
    } else if (c == '\n') {
      ++pos_;
      ++line_;
    }
    break;  // a line end, or the end of the input
  }
  fields.resize(count);
  blank_ = count == 1 && !quoted && fields[0].empty();
  return Result::kRecord;
}

void AppendCsvField(std::string& out, std::string_view field, char separator) {
  bool quote = false;
  for (const char c : field) {
    if (c == separator || c == '"' || c == '\n' || c == '\r') {
      quote = true;
      break;
    }
  }
  if (!quote) {
    out.append(field);
    return;
  }
  out.push_back('"');
  for (const char c : field) {
    if (c == '"') out.push_back('"');
    out.push_back(c);
  }
  out.push_back('"');
}

void AppendCsvRecord(std::string& out, const std::vector<std::string>& fields, char separator) {
  for (size_t i = 0; i < fields.size(); ++i) {
    if (i != 0) out.push_back(separator);
    AppendCsvField(out, fields[i], separator);
  }
  out.push_back('\n');
}

bool SplitCsvText(const std::string& text, std::vector<std::string>& fields, char separator) {
  fields.clear();
  std::istringstream in(text);
  CsvReader reader(in, separator);
  if (reader.Next(fields) != CsvReader::Result::kRecord) return false;
  std::vector<std::string> more;
  return reader.Next(more) == CsvReader::Result::kEnd;
}

}  // namespace qzscore
