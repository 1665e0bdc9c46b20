#include "slideshow/subfile_table.h"

#include <algorithm>

#include "slideshow/container_format.h"

namespace pelo::slideshow {

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

}  // namespace pelo::slideshow
