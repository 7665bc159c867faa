// Diagnostic output to a stream chosen by the host.
#include "QZDisplay.h"

#include <atomic>
#include <iostream>
#include <mutex>

namespace QZDisplay_800 {

namespace {

std::atomic<std::ostream*> gStream{&std::cerr};

std::mutex& WriteLock() {
  static std::mutex* lock = new std::mutex();  // never destroyed: usable during exit
  return *lock;
}

// Writes the parts under the lock; a failing stream or allocation is swallowed, since
// diagnostics must never break the operation that emits them.
template <class... Parts>
void Write(const Parts&... parts) noexcept {
  try {
    std::lock_guard<std::mutex> guard(WriteLock());
    std::ostream* stream = gStream.load();
    if (stream == nullptr) return;
    (*stream << ... << parts);
    stream->flush();
  } catch (...) {
  }
}

}  // namespace

void SetDisplayStream(std::ostream* stream) noexcept {
  try {
    std::lock_guard<std::mutex> guard(WriteLock());
    gStream.store(stream);
  } catch (...) {
    gStream.store(stream);
  }
}

std::ostream* GetDisplayStream() noexcept { return gStream.load(); }

void DisplayI(const std::string& caption, int value) noexcept {
  Write(caption, ": ", value, '\n');
}

void DisplayS(const std::string& caption, const std::string& text) noexcept {
  Write(caption, ": ", text, '\n');
}

void DisplayText(int /*level*/, const std::string& text) noexcept { Write(text); }

}  // namespace QZDisplay_800
