// Adding pictures behind the last one, and inserting them in front of others.
#include <cstdint>

#include "slideshow/SlideShow.h"
#include "slideshow/container_edit.h"
#include "slideshow/container_format.h"
#include "slideshow/picture_intake.h"
#include "slideshow/subfile_table.h"

using namespace pelo::slideshow;

namespace {

bool usable(const PictureSource& source) {
  return source.path != nullptr ? usable_path(source.path) : source.data != nullptr;
}

bool append_end_mark(ContainerSession& session, const SlideShow& show) {
  return session.seek_end() >= 0 && write_end_mark(session, show.musicSize);
}

// The container's side, once the table holds the new picture. The mark behind the header keeps the
// file's end valid while the picture is written; at the end of the data the picture covers every older
// mark, and the last mark closes the file again.
bool write_picture(ContainerEdit& edit, const SlideShow& show, int position, const uint8_t* jpeg) {
  ContainerSession& session = edit.session();
  const bool last = position == show.subfileCount - 1;
  plan_data_up(edit.shift(), show, position + 1, show.subfiles[position].size);
  return edit.move(1) && write_header(session, show) && append_end_mark(session, show) &&
         write_subfile(session, show.subfiles[position], jpeg) &&
         (last || write_subfile_headers(session, show)) && append_end_mark(session, show) &&
         session.close();
}

bool store_in_file(SlideShow& show, const subfileInfo& entry, const uint8_t* jpeg, int position) {
  ContainerEdit edit(show);
  if (!edit.remember(position < show.subfileCount, entry.size)) return false;
  if (!file_stays_small(show, edit.old_length(), entry.size)) return false;

  insert_entry(show, position, entry);
  if (write_picture(edit, show, position, jpeg)) return true;
  edit.roll_back();
  erase_entry(show, position);
  return false;
}

// In the table and in the container, 0 <= position <= subfileCount. 1, or 0 with the show as it was and
// the container put back.
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

}  // namespace

int SlideShow::AddFile(const char* imagePath, const char* imageName, char imageFlag) {
  return store_picture(*this, {imagePath, nullptr, 0}, imageName, subfileCount, imageFlag);
}

int SlideShow::AddBuffer(void* data, int length, const char* imageName, char imageFlag) {
  return store_picture(*this, {nullptr, data, length}, imageName, subfileCount, imageFlag);
}

int SlideShow::InsertFile(const char* imagePath, const char* imageName, int position, char imageFlag) {
  if (!valid_index(*this, position)) return 0;
  return store_picture(*this, {imagePath, nullptr, 0}, imageName, position, imageFlag);
}

int SlideShow::InsertBuffer(void* data, int length, const char* imageName, int position,
                            char imageFlag) {
  if (!valid_index(*this, position)) return 0;
  return store_picture(*this, {nullptr, data, length}, imageName, position, imageFlag);
}

int SlideShow::AddImageToFile(const char* imagePath, const char* imageName) {
  return AddFile(imagePath, imageName, 1);
}

int SlideShow::AddImageToBuffer(void* data, int length, const char* imageName) {
  return AddBuffer(data, length, imageName, 1);
}

int SlideShow::InsertImageToFile(const char* imagePath, const char* imageName, int position) {
  return position == subfileCount ? AddFile(imagePath, imageName, 1)
                                  : InsertFile(imagePath, imageName, position, 1);
}

int SlideShow::InsertImageToBuffer(void* data, int length, const char* imageName, int position) {
  return position == subfileCount ? AddBuffer(data, length, imageName, 1)
                                  : InsertBuffer(data, length, imageName, position, 1);
}
