#include "slideshow/data_shift.h"

#include <algorithm>

#include "slideshow/container_session.h"
#include "slideshow/persist.h"

namespace pelo::slideshow {

void DataShift::add(int64_t from, int64_t to, int64_t size) {
  runs_[runCount_++] = {from, to, size};
}

int64_t DataShift::piece_size() const {
  return std::min(piece_, runs_[run_].size - done_);
}

bool DataShift::forth(SlideShow& show, int64_t piece, int tries) {
  if (moved_all()) return true;
  int64_t largest = 0;
  for (int i = 0; i < runCount_; ++i) largest = std::max(largest, runs_[i].size);
  piece_ = std::min(piece, largest);
  buffer_ = vss_bytes(piece_);
  if (buffer_ == nullptr) return false;

  for (int failures = 0; failures < tries; ++failures) {
    ContainerSession session(show, "r+b");
    while (!moved_all() && move_piece(session)) failures = 0;
    if (session.close() && moved_all()) return true;
  }
  return false;
}

// Flushed while the piece is still at hand: a full disk shows here, not at the next seek.
bool DataShift::move_piece(ContainerSession& session) {
  const Run& run = runs_[run_];
  const int64_t size = piece_size();
  if (!held_) {
    session.seek(run.from + done_);
    held_ = session.read(buffer_.get(), size);
  }
  session.seek(run.to + done_);
  session.write(buffer_.get(), size);
  if (!session.flush()) return false;
  held_ = false;
  done_ += size;
  if (done_ == run.size) {
    ++run_;
    done_ = 0;
  }
  return true;
}

void DataShift::back(SlideShow& show) {
  if (buffer_ == nullptr) return;
  for (bool more = held_ || step_back(); more; more = step_back()) {
    (void)persist([&] { return return_piece(show); });
    held_ = false;
  }
}

bool DataShift::step_back() {
  if (done_ == 0) {
    if (run_ == 0) return false;
    done_ = runs_[--run_].size;
  }
  done_ = (done_ - 1) / piece_ * piece_;
  return true;
}

// A second try has the piece at hand: the first may have written over its copy in the file.
bool DataShift::return_piece(SlideShow& show) {
  ContainerSession session(show, "r+b");
  const Run& run = runs_[run_];
  if (!held_) {
    session.seek(run.to + done_);
    held_ = session.read(buffer_.get(), piece_size());
  }
  session.seek(run.from + done_);
  session.write(buffer_.get(), piece_size());
  return session.close();
}

}  // namespace pelo::slideshow
