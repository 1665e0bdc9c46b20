// The in-memory table of a show's pictures and the offsets that follow from their sizes.
#pragma once

#include <cstdint>

#include "slideshow/SlideShow.h"

namespace pelo::slideshow {

inline bool valid_index(const SlideShow& show, int index) {
  return show.mode != SlideShow::kFree && index >= 0 && index < show.subfileCount;
}

// One more picture fits.
bool has_room(const SlideShow& show);

// Where a container's data ends: behind the last picture, or behind the header.
int64_t data_end(const SlideShow& show);

// Sets the offsets of the pictures from `first` on, each directly behind its predecessor.
void place_subfiles(SlideShow& show, int first);

// Puts `entry` at `position` (0 to subfileCount; the table has room) and moves the later ones up.
void insert_entry(SlideShow& show, int position, const subfileInfo& entry);

// Takes the entry at `position` out again; the freed one at the top is all zero.
void erase_entry(SlideShow& show, int position);

}  // namespace pelo::slideshow
