// One open container: opened by the show's path into the show's `file`, closed and cleared on every way
// out. An edit has one from its first look at the file to its last write.
#pragma once

#include <cstddef>
#include <cstdint>

#include "slideshow/SlideShow.h"

namespace pelo::slideshow {

// After a step that does not complete the session does nothing more and close() answers false, so that a
// caller may write its steps in a row and ask once.
class ContainerSession {
 public:
  // Not good() unless the show is in file mode, no other operation holds its stream, and the file opens.
  ContainerSession(SlideShow& show, const char* openMode);
  ~ContainerSession();
  ContainerSession(const ContainerSession&) = delete;
  ContainerSession& operator=(const ContainerSession&) = delete;

  bool good() const { return good_; }
  void fail() { good_ = false; }

  // Ends what a step that failed has begun, and opens the file again to read and write: for second tries
  // and the way back alone, since the file at the path may be another by now.
  bool reopen();

  // Each answers good().
  bool seek(int64_t position);  // from the start
  bool skip(int64_t bytes);     // from the current position
  bool read(void* destination, int64_t bytes);
  bool write(const void* source, int64_t bytes);
  bool flush();

  // Seeks to the end; the file's length in bytes, -1 when it cannot be told or exceeds 31 bits.
  int64_t seek_end();

  // True when every step completed and the file's last bytes are written. The stream is closed in any
  // case, so nothing is good() afterwards; the destructor closes what is left open.
  [[nodiscard]] bool close();

 private:
  void open(const char* openMode);
  bool move(int64_t distance, int whence);

  SlideShow& show_;
  bool open_ = false;
  bool good_ = false;
};

// A call that fails once does not decide.
constexpr int kTries = 2;

// Runs a step until it answers true, kTries times at the most. For steps behind the point from which an
// edit cannot be undone without loss, and for those that undo.
template <class Step>
bool persist(Step step) {
  for (int i = 0; i < kTries; ++i) {
    if (step()) return true;
  }
  return false;
}

// The same on an open container; a second try has a stream of its own.
template <class Step>
bool persist(ContainerSession& session, Step step) {
  return persist([&] { return (session.good() || session.reopen()) && step(); });
}

}  // namespace pelo::slideshow
