#include "slideshow/data_shift.h"

#include <algorithm>

#include "slideshow/container_format.h"
#include "slideshow/container_session.h"

namespace pelo::slideshow {
namespace {

int64_t data_offset(const subfileInfo& entry) {
  return int64_t{entry.offset} + kSubfileHeaderSize;
}

int64_t data_size(const subfileInfo& entry) {
  return int64_t{entry.size} - kSubfileHeaderSize;
}

}  // namespace

bool DataShift::up(SlideShow& show, int first, int64_t distance) {
  distance_ = distance;
  moved_ = show.subfileCount;
  if (first >= moved_) return true;

  int64_t largest = 0;
  for (int i = first; i < moved_; ++i) largest = std::max(largest, data_size(show.subfiles[i]));
  buffer_ = vss_bytes(largest);
  if (buffer_ == nullptr) return false;

  ContainerSession session(show, "r+b");
  while (moved_ > first && move_up(session, show.subfiles[moved_ - 1])) --moved_;
  return session.close() && moved_ == first;
}

// Flushed while the copy is still at hand: a full disk shows here, not at the next seek.
bool DataShift::move_up(ContainerSession& session, const subfileInfo& entry) {
  session.seek(data_offset(entry) - distance_);
  if (!session.read(buffer_.get(), data_size(entry))) return false;
  session.seek(data_offset(entry));
  held_ = true;
  session.write(buffer_.get(), data_size(entry));
  held_ = !session.flush();
  return !held_;
}

void DataShift::back(SlideShow& show) {
  if (buffer_ == nullptr) return;
  ContainerSession session(show, "r+b");
  if (held_) {
    const subfileInfo& entry = show.subfiles[moved_ - 1];
    session.seek(data_offset(entry) - distance_);
    held_ = !session.write(buffer_.get(), data_size(entry));
  }
  while (moved_ < show.subfileCount && move_back(session, show.subfiles[moved_])) ++moved_;
}

bool DataShift::move_back(ContainerSession& session, const subfileInfo& entry) {
  session.seek(data_offset(entry));
  session.read(buffer_.get(), data_size(entry));
  session.seek(data_offset(entry) - distance_);
  return session.write(buffer_.get(), data_size(entry));
}

}  // namespace pelo::slideshow
