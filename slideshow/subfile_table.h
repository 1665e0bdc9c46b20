// The in-memory table of a show's pictures and the offsets that follow from their sizes.
#pragma once

#include <cstdint>

#include "slideshow/SlideShow.h"

namespace pelo::slideshow {

class DataShift;

// subfileInfo.state, bit 0: to be removed by the next compaction. Never outlives an open show: what a
// file says of it is ignored.
constexpr int kMarked = 1;

inline bool valid_index(const SlideShow& show, int index) {
  return show.mode != SlideShow::kFree && index >= 0 && index < show.subfileCount;
}

// A picture as the show displays it, in pixels.
struct DisplaySize {
  int width;
  int height;
};
DisplaySize display_size(const SlideShow& show, const subfileInfo& entry);

// One more picture fits.
bool has_room(const SlideShow& show);

// Where a container's data ends: behind the last picture, or behind the header.
int64_t data_end(const SlideShow& show);

// After an edit that adds that many bytes to the data of a file of `fileLength` bytes, and up to two end
// marks, every offset in the file still fits 31 bits.
bool file_stays_small(const SlideShow& show, int64_t fileLength, int64_t added);

// Sets the offsets of the pictures from `first` on, each directly behind its predecessor.
void place_subfiles(SlideShow& show, int first);

// Puts `entry` at `position` (0 to subfileCount; the table has room) and moves the later ones up.
void insert_entry(SlideShow& show, int position, const subfileInfo& entry);

// Takes the entry at `position` out again; the freed one at the top is all zero.
void erase_entry(SlideShow& show, int position);

// Plans the way up, by `distance` bytes, for the JPEG data of the pictures from `first` on: the last one
// first, so that nothing is overwritten before it was read. The table holds their upper offsets already.
void plan_data_up(DataShift& shift, const SlideShow& show, int first, int64_t distance);

}  // namespace pelo::slideshow
