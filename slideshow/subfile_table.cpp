#include "slideshow/subfile_table.h"

#include <algorithm>
#include <climits>

#include "slideshow/container_format.h"
#include "slideshow/data_shift.h"

namespace pelo::slideshow {

DisplaySize display_size(const SlideShow& show, const subfileInfo& entry) {
  const auto scaled = [](int64_t limit, int other, int side) {
    return side == 0 ? 0 : static_cast<int>(limit * other / side);
  };
  const int w = entry.width;
  const int h = entry.height;
  if (w >= h) return {std::min(w, show.width), w <= show.width ? h : scaled(show.width, h, w)};
  return {h <= show.height ? w : scaled(show.height, w, h), std::min(h, show.height)};
}

bool has_room(const SlideShow& show) {
  switch (show.mode) {
    case SlideShow::kFileMode:
      return show.subfileCount < SlideShow::kMaxFileSubfiles;
    case SlideShow::kMemoryMode:
      return show.subfileCount < SlideShow::kMaxMemorySubfiles;
    default:
      return false;
  }
}

int64_t data_end(const SlideShow& show) {
  if (show.subfileCount == 0) return int64_t{show.musicSize} + kHeaderSize;
  const subfileInfo& last = show.subfiles[show.subfileCount - 1];
  return int64_t{last.offset} + last.size;
}

bool file_stays_small(const SlideShow& show, int64_t fileLength, int64_t added) {
  return std::max(fileLength, data_end(show) + added) + 2 * kEndMarkSize <= INT_MAX;
}

// In memory mode the offsets mean nothing, and the size of the music may make them wrap.
void place_subfiles(SlideShow& show, int first) {
  for (int i = first; i < show.subfileCount; ++i) {
    const int64_t offset = i == 0 ? int64_t{show.musicSize} + kHeaderSize
                                  : int64_t{show.subfiles[i - 1].offset} + show.subfiles[i - 1].size;
    show.subfiles[i].offset = static_cast<int>(offset);
    if (show.mode == SlideShow::kFileMode) show.subfileOffsets[i] = show.subfiles[i].offset;
  }
}

void insert_entry(SlideShow& show, int position, const subfileInfo& entry) {
  subfileInfo* const end = show.subfiles + show.subfileCount;
  std::copy_backward(show.subfiles + position, end, end + 1);
  show.subfiles[position] = entry;
  ++show.subfileCount;
  place_subfiles(show, position);
}

void erase_entry(SlideShow& show, int position) {
  subfileInfo* const end = show.subfiles + show.subfileCount;
  std::copy(show.subfiles + position + 1, end, show.subfiles + position);
  --show.subfileCount;
  show.subfiles[show.subfileCount] = subfileInfo{};
  if (show.mode == SlideShow::kFileMode) show.subfileOffsets[show.subfileCount] = 0;
  place_subfiles(show, position);
}

void plan_data_up(DataShift& shift, const SlideShow& show, int first, int64_t distance) {
  for (int i = show.subfileCount - 1; i >= first; --i) {
    const int64_t to = int64_t{show.subfiles[i].offset} + kSubfileHeaderSize;
    const int64_t size = int64_t{show.subfiles[i].size} - kSubfileHeaderSize;
    shift.add(to - distance, to, size, size);
  }
}

}  // namespace pelo::slideshow
