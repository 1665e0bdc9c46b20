#include "slideshow/data_shift.h"

#include <algorithm>

#include "slideshow/container_session.h"

namespace pelo::slideshow {

void DataShift::add(int64_t from, int64_t to, int64_t size, int64_t piece) {
  runs_[runCount_++] = {from, to, size, std::min(piece, size)};
}

int64_t DataShift::piece_size() const {
  return std::min(runs_[run_].piece, runs_[run_].size - done_);
}

bool DataShift::forth(ContainerSession& session, int tries, int64_t spare) {
  if (moved_all() && spare == 0) return true;
  int64_t room = spare;
  for (int i = 0; i < runCount_; ++i) room = std::max(room, runs_[i].piece);
  buffer_ = vss_bytes(room);
  if (buffer_ == nullptr) return false;
  if (moved_all()) return true;

  for (int failures = 0; failures < tries; ++failures) {
    if (!session.good() && !session.reopen()) continue;
    while (!moved_all() && move_piece(session)) failures = 0;
    if (moved_all()) return true;
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

void DataShift::back(ContainerSession& session) {
  if (buffer_ == nullptr) return;
  for (bool more = held_ || step_back(); more; more = step_back()) {
    (void)persist(session, [&] { return return_piece(session); });
    held_ = false;
  }
}

bool DataShift::step_back() {
  if (done_ == 0) {
    if (run_ == 0) return false;
    done_ = runs_[--run_].size;
  }
  const int64_t piece = runs_[run_].piece;
  done_ = (done_ - 1) / piece * piece;
  return true;
}

// A second try has the piece at hand: the first may have written over its copy in the file.
bool DataShift::return_piece(ContainerSession& session) {
  const Run& run = runs_[run_];
  if (!held_) {
    session.seek(run.to + done_);
    held_ = session.read(buffer_.get(), piece_size());
  }
  session.seek(run.from + done_);
  session.write(buffer_.get(), piece_size());
  return session.flush();
}

}  // namespace pelo::slideshow
