#include "Output.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <iostream>

namespace qzscore {

void Report(const std::string& line) {
  const std::string text = "qzscore: " + line + "\n";
  std::fwrite(text.data(), 1, text.size(), stderr);
  std::fflush(stderr);
}

std::string DisplayName(const std::string& path) {
  return path == "-" ? std::string("standard input") : path;
}

std::unique_ptr<std::istream, void (*)(std::istream*)> OpenInput(const std::string& path,
                                                                 uint64_t& size,
                                                                 std::string& error) {
  size = 0;
  if (path == "-") return {&std::cin, [](std::istream*) {}};
  std::error_code ignored;
  if (std::filesystem::is_directory(path, ignored)) {
    error = path + ": is a folder, not a CSV file";
    return {nullptr, [](std::istream*) {}};
  }
  auto file = std::make_unique<std::ifstream>(path, std::ios::binary);
  if (!*file) {
    error = path + ": cannot open: " + std::strerror(errno);
    return {nullptr, [](std::istream*) {}};
  }
  const auto bytes = std::filesystem::file_size(path, ignored);
  if (!ignored) size = bytes;
  return {file.release(), [](std::istream* in) { delete in; }};
}

std::unique_ptr<std::ostream, void (*)(std::ostream*)> OpenOutput(const std::string& path,
                                                                  std::string& error) {
  if (path.empty() || path == "-") return {&std::cout, [](std::ostream*) {}};
  auto file = std::make_unique<std::ofstream>(path, std::ios::binary | std::ios::trunc);
  if (!*file) {
    error = path + ": cannot create the output file: " + std::strerror(errno);
    return {nullptr, [](std::ostream*) {}};
  }
  return {file.release(), [](std::ostream* out) { delete out; }};
}

}  // namespace qzscore
