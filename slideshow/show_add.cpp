// Adding pictures behind the others and inserting them between.
#include <climits>
#include <cstdint>
#include <memory>

#include "slideshow/SlideShow.h"
#include "slideshow/container_backup.h"
#include "slideshow/container_format.h"
#include "slideshow/container_session.h"
#include "slideshow/picture.h"
#include "slideshow/subfile_table.h"
#include "slideshow/text_field.h"

using namespace pelo::slideshow;

namespace {

struct CloseFile {
  void operator()(FILE* stream) const { (void)vss_fclose(stream); }
};

// Moves the JPEG data of the pictures behind an insertion up, last one first, and back down again. One
// picture's data is in memory at a time; nothing is overwritten before it has been read.
class DataShift {
 public:
  DataShift(SlideShow& show, int position, int distance)
      : show_(show), position_(position), distance_(distance), firstMoved_(show.subfileCount) {}

  // False when a step fails; back_down() then undoes what was done.
  bool up() {
    ContainerSession session(show_, "r+b");
    if (!keep_headers(session)) return false;
    for (int i = show_.subfileCount - 1; session.good() && i >= position_; --i) {
      pending_ = load(session, i, 0);
      if (!pending_) return false;
      dirty_ = true;
      store(session, i, distance_, pending_.get());
      if (!session.flush()) return false;
      dirty_ = false;
      firstMoved_ = i;
    }
    pending_.reset();
    return session.close();
  }

  // The entries must be those of before the insertion.
  void back_down() {
    ContainerSession session(show_, "r+b");
    if (dirty_) store(session, firstMoved_ - 1, 0, pending_.get());
    for (int i = firstMoved_; session.good() && i < show_.subfileCount; ++i) {
      const VssBytes data = load(session, i, distance_);
      if (!data) return;
      store(session, i, 0, data.get());
    }
    for (int i = position_; headers_ && i < show_.subfileCount; ++i) {
      session.seek(show_.subfiles[i].offset);
      session.write(header(i), kSubfileHeaderSize);
    }
    (void)session.close();
  }

 private:
  // The headers as they stand in the file: new ones will overwrite them.
  bool keep_headers(ContainerSession& session) {
    const int count = show_.subfileCount - position_;
    if (count == 0) return session.good();
    headers_ = vss_bytes(int64_t{count} * kSubfileHeaderSize);
    for (int i = position_; headers_ && i < show_.subfileCount; ++i) {
      session.seek(show_.subfiles[i].offset);
      session.read(header(i), kSubfileHeaderSize);
    }
    if (!session.good()) headers_.reset();  // half read, and nothing to undo yet
    return headers_ != nullptr;
  }
  uint8_t* header(int index) { return headers_.get() + (index - position_) * kSubfileHeaderSize; }

  int64_t data_offset(int index, int distance) const {
    return int64_t{show_.subfiles[index].offset} + distance + kSubfileHeaderSize;
  }
  int64_t data_size(int index) const { return int64_t{show_.subfiles[index].size} - kSubfileHeaderSize; }

  VssBytes load(ContainerSession& session, int index, int distance) {
    VssBytes data = vss_bytes(data_size(index));
    if (!data) return nullptr;
    session.seek(data_offset(index, distance));
    return session.read(data.get(), data_size(index)) ? std::move(data) : nullptr;
  }
  void store(ContainerSession& session, int index, int distance, const uint8_t* data) {
    session.seek(data_offset(index, distance));
    session.write(data, data_size(index));
  }

  SlideShow& show_;
  int position_;
  int distance_;
  VssBytes headers_;
  int firstMoved_;    // this picture and the later ones have been moved
  VssBytes pending_;  // the one before, while it is written
  bool dirty_ = false;
};

// The new picture's place on disk. The first end mark makes the file end in two; the picture, longer than
// both, overwrites them when it is the last one.
bool write_picture(SlideShow& show, int position, const uint8_t* jpeg) {
  const bool last = position == show.subfileCount - 1;
  return show.writeVssHeader("r+b") && show.writeEndMark() && show.writeSubfile(position, jpeg) &&
         (last || show.writeSubfileHeader()) && show.writeEndMark();
}

bool store_picture(SlideShow& show, int position, const subfileInfo& entry, const uint8_t* jpeg) {
  const int64_t overwritten = int64_t{entry.size} + 2 * kEndMarkSize;
  if (data_end(show) + overwritten > INT_MAX) return false;
  ContainerBackup backup;
  if (!backup.take(show, overwritten)) return false;

  DataShift shift(show, position, entry.size);
  if (shift.up()) {
    insert_entry(show, position, entry);
    if (write_picture(show, position, jpeg)) return true;
    erase_entry(show, position);
  }
  shift.back_down();
  backup.restore(show);
  return false;
}

int add(SlideShow& show, const PictureSource& source, const char* name, int position, char flag) {
  if (!has_room(show)) return 0;
  subfileInfo entry;
  std::unique_ptr<FILE, CloseFile> held;
  if (source.path != nullptr) {
    if (!usable_path(source.path)) return 0;
    held.reset(vss_fopen(source.path, "rb"));
    if (!held) return 0;
  } else if (source.data == nullptr) {
    return 0;
  }
  JpegBytes jpeg;
  if (!make_picture(show, source, name, flag, entry, jpeg)) return 0;
  held.reset();
  if (show.mode == SlideShow::kFileMode) return store_picture(show, position, entry, jpeg.get());
  insert_entry(show, position, entry);
  return 1;
}

bool valid_position(const SlideShow& show, int position) {
  return position >= 0 && position <= show.subfileCount;
}

}  // namespace

int SlideShow::AddFile(const char* imagePath, const char* imageName, char imageFlag) {
  return imagePath == nullptr ? 0 : add(*this, {imagePath, nullptr, 0}, imageName, subfileCount, imageFlag);
}

int SlideShow::AddBuffer(void* data, int length, const char* imageName, char imageFlag) {
  return add(*this, {nullptr, data, length}, imageName, subfileCount, imageFlag);
}

int SlideShow::InsertFile(const char* imagePath, const char* imageName, int position, char imageFlag) {
  if (imagePath == nullptr || !valid_position(*this, position)) return 0;
  return add(*this, {imagePath, nullptr, 0}, imageName, position, imageFlag);
}

int SlideShow::InsertBuffer(void* data, int length, const char* imageName, int position, char imageFlag) {
  if (!valid_position(*this, position)) return 0;
  return add(*this, {nullptr, data, length}, imageName, position, imageFlag);
}

int SlideShow::AddImageToFile(const char* imagePath, const char* imageName) {
  return AddFile(imagePath, imageName, 1);
}

int SlideShow::AddImageToBuffer(void* data, int length, const char* imageName) {
  return AddBuffer(data, length, imageName, 1);
}

int SlideShow::InsertImageToFile(const char* imagePath, const char* imageName, int position) {
  return InsertFile(imagePath, imageName, position, 1);
}

int SlideShow::InsertImageToBuffer(void* data, int length, const char* imageName, int position) {
  return InsertBuffer(data, length, imageName, position, 1);
}
