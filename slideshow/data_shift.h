// Moves the JPEG data of a container's later pictures up to make room in front of them, and back again.
#pragma once

#include <cstdint>

#include "slideshow/SlideShow.h"
#include "slideshow/vss_wrappers.h"

namespace pelo::slideshow {

class ContainerSession;

class DataShift {
 public:
  // Moves the data of the pictures from `first` on by `distance` bytes to the offsets that the table
  // holds already. Only data moves: the pictures' headers are to be written after. Goes from the last
  // picture down, so that nothing is overwritten before it was read. True when all arrived.
  [[nodiscard]] bool up(SlideShow& show, int first, int64_t distance);

  // Undoes up(), however far it came; the table still holds the upper offsets. Needs no memory.
  void back(SlideShow& show);

 private:
  bool move_up(ContainerSession& session, const subfileInfo& entry);
  bool move_back(ContainerSession& session, const subfileInfo& entry);

  VssBytes buffer_;       // room for the largest picture's data
  int64_t distance_ = 0;  // bytes
  int moved_ = 0;         // pictures from here on lie at their new place
  // buffer_ holds the only whole copy of the data of picture moved_ - 1: its write was begun, and the
  // new place may overlap the old one.
  bool held_ = false;
};

}  // namespace pelo::slideshow
