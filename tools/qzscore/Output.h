// Small helpers the subcommands share: messages on standard error, opening input and
// output files.
#ifndef QZSCORE_OUTPUT_H_
#define QZSCORE_OUTPUT_H_

#include <cstdint>
#include <fstream>
#include <istream>
#include <memory>
#include <ostream>
#include <string>

namespace qzscore {

// Writes "qzscore: " + line and a line end to standard error at once.
void Report(const std::string& line);

// An input file, or standard input for "-"; null with a message when it cannot be
// opened. size receives the file's size in bytes, 0 when unknown.
std::unique_ptr<std::istream, void (*)(std::istream*)> OpenInput(const std::string& path,
                                                                 uint64_t& size,
                                                                 std::string& error);
// An output file (created or truncated), or standard output for "" and "-"; null with
// a message when it cannot be created.
std::unique_ptr<std::ostream, void (*)(std::ostream*)> OpenOutput(const std::string& path,
                                                                  std::string& error);

// The name to use for a file in messages ("standard input" for "-").
std::string DisplayName(const std::string& path);

}  // namespace qzscore

#endif  // QZSCORE_OUTPUT_H_
