#include "slideshow/store_picture.h"

#include <cstdint>

#include "slideshow/container_undo.h"
#include "slideshow/data_shift.h"
#include "slideshow/subfile_table.h"
#include "slideshow/text_field.h"

namespace pelo::slideshow {
namespace {

bool usable(const PictureSource& source) {
  return source.path != nullptr ? usable_path(source.path) : source.data != nullptr;
}

// The container's side, once the table holds the new picture. The mark behind the header keeps the
// file's end valid while the picture is written; at the end of the data the picture covers every older
// mark, and the last mark closes the file again.
bool write_picture(SlideShow& show, DataShift& shift, int position, const uint8_t* jpeg) {
  const bool last = position == show.subfileCount - 1;
  plan_data_up(shift, show, position + 1, show.subfiles[position].size);
  return shift.forth(show, 1) && show.writeVssHeader("r+b") == 1 && show.writeEndMark() == 1 &&
         show.writeSubfile(position, jpeg) == 1 && (last || show.writeSubfileHeader() == 1) &&
         show.writeEndMark() == 1;
}

bool store_in_file(SlideShow& show, const subfileInfo& entry, const uint8_t* jpeg, int position) {
  ContainerUndo undo;
  if (!undo.remember(show, position < show.subfileCount, entry.size)) return false;
  if (!file_stays_small(show, undo.length(), entry.size)) return false;

  insert_entry(show, position, entry);
  DataShift shift;
  if (write_picture(show, shift, position, jpeg)) return true;
  shift.back(show);
  undo.put_back(show);
  erase_entry(show, position);
  return false;
}

}  // namespace

int store_picture(SlideShow& show, const PictureSource& source, const char* name, int position,
                  char flag) {
  subfileInfo entry;
  JpegBytes jpeg;
  if (!has_room(show) || !usable(source) || !make_picture(show, source, name, flag, entry, jpeg))
    return 0;
  if (show.mode == SlideShow::kFileMode) return store_in_file(show, entry, jpeg.get(), position) ? 1 : 0;
  insert_entry(show, position, entry);
  return 1;
}

}  // namespace pelo::slideshow
