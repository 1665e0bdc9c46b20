// Removing pictures: marking them, and the compaction that takes them out.
#include "slideshow/SlideShow.h"
#include "slideshow/compact.h"
#include "slideshow/subfile_table.h"

using namespace pelo::slideshow;

int SlideShow::RemoveImage(int index) {
  if (mode != kFileMode || !valid_index(*this, index)) return 0;
  subfiles[index].state |= kMarked;
  return 1;
}

int SlideShow::GetImageState(int index) const {
  return mode == kFileMode && valid_index(*this, index) ? subfiles[index].state : 0;
}

int SlideShow::RemoveSubfile() {
  return mode == kFileMode && compact(*this) ? 1 : 0;
}
