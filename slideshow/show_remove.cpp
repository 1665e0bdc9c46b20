// Removing pictures: marking them, and the compaction that takes them out and closes the gaps.
#include <algorithm>
#include <cstdint>
#include <iterator>
#include <utility>

#include "slideshow/SlideShow.h"
#include "slideshow/container_edit.h"
#include "slideshow/container_format.h"
#include "slideshow/subfile_table.h"

using namespace pelo::slideshow;

namespace {

// The pictures of a show in file mode.
struct Table {
  subfileInfo entries[SlideShow::kMaxFileSubfiles];
  int count = 0;
};

void exchange(SlideShow& show, Table& table) {
  std::swap_ranges(std::begin(table.entries), std::end(table.entries), show.subfiles);
  std::swap(table.count, show.subfileCount);
  std::fill(std::begin(show.subfileOffsets), std::end(show.subfileOffsets), 0);
  place_subfiles(show, 0);
}

// What the file says of a picture, as far as it may be believed.
void read_stored(ContainerSession& session, const subfileInfo& entry, subfileInfo& stored) {
  session.seek(entry.offset);
  read_subfile_header(session, stored);
  if (stored.size != entry.size) session.fail();
  stored.state &= ~kMarked;
}

// Lists the pictures to keep and the moves that close the gaps. Pictures in front of the first marked
// one stay where they are.
bool plan(ContainerEdit& edit, const SlideShow& show, Table& kept) {
  int64_t end = int64_t{show.musicSize} + kHeaderSize;
  for (int i = 0; i < show.subfileCount; ++i) {
    const subfileInfo& entry = show.subfiles[i];
    if ((entry.state & kMarked) != 0) continue;
    read_stored(edit.session(), entry, kept.entries[kept.count++]);
    if (entry.offset != end) edit.shift().add(entry.offset, end, entry.size, entry.size);
    end += entry.size;
  }
  return edit.session().good();
}

// Takes the marked pictures out. False with the show as it was, and what that leaves of the container.
bool compact(SlideShow& show) {
  ContainerEdit edit(show);
  Table table;
  if (!edit.remember(true, kEndMarkSize) || !plan(edit, show, table)) return false;

  if (edit.move(kTries)) {
    exchange(show, table);
    if (edit.finish(data_end(show))) return true;
    exchange(show, table);
  }
  edit.roll_back();
  return false;
}

}  // namespace

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
