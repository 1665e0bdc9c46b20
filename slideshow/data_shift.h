// Moves runs of bytes to another place in a container, and back again.
#pragma once

#include <cstdint>

#include "slideshow/SlideShow.h"
#include "slideshow/vss_wrappers.h"

namespace pelo::slideshow {

class ContainerSession;

class DataShift {
 public:
  // Plans one more run, one a picture and one other at the most. It moves `piece` bytes at a time. In
  // the order of add() no run's new place may cover a run that is still to be moved; a run that overlaps
  // its own new place and is longer than a piece must move down.
  void add(int64_t from, int64_t to, int64_t size, int64_t piece);

  // Moves the runs through one buffer, which holds the largest piece and at least `spare` bytes. Each
  // step is tried `tries` times before the whole is given up. True when all arrived; without memory
  // nothing moves.
  [[nodiscard]] bool forth(ContainerSession& session, int tries, int64_t spare = 0);

  // After forth() was true: its buffer, free for other use.
  uint8_t* spare() { return buffer_.get(); }

  // Undoes forth(), however far it came, as long as the file was not cut since. Needs no memory; each
  // piece is tried twice, even when another failed.
  void back(ContainerSession& session);

 private:
  struct Run {
    int64_t from;
    int64_t to;
    int64_t size;
    int64_t piece;
  };

  bool moved_all() const { return run_ == runCount_; }
  int64_t piece_size() const;
  bool move_piece(ContainerSession& session);
  bool step_back();
  bool return_piece(ContainerSession& session);

  Run runs_[SlideShow::kMaxFileSubfiles + 1] = {};
  int runCount_ = 0;
  VssBytes buffer_;
  int run_ = 0;       // the next piece belongs to this run
  int64_t done_ = 0;  // bytes of it that have moved
  // buffer_ holds the only whole copy of the next piece: its write was begun, and the new place may
  // overlap the old one.
  bool held_ = false;
};

}  // namespace pelo::slideshow
