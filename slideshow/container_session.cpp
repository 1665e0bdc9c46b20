#include "slideshow/container_session.h"

#include <limits>
#include <utility>

#include "slideshow/vss_wrappers.h"

namespace pelo::slideshow {

ContainerSession::ContainerSession(SlideShow& show, const char* openMode) : show_(show) {
  open(openMode);
}

ContainerSession::~ContainerSession() {
  (void)close();
}

void ContainerSession::open(const char* openMode) {
  if (show_.mode != SlideShow::kFileMode || show_.file != nullptr || openMode == nullptr) return;
  show_.file = vss_fopen(show_.pathName, openMode);
  open_ = good_ = show_.file != nullptr;
}

bool ContainerSession::reopen() {
  (void)close();
  open("r+b");
  return good_;
}

bool ContainerSession::close() {
  const bool complete = std::exchange(good_, false);
  if (!std::exchange(open_, false)) return false;
  return vss_fclose(std::exchange(show_.file, nullptr)) == 0 && complete;
}

bool ContainerSession::move(int64_t distance, int whence) {
  if (!good_) return false;
  good_ = distance >= 0 && distance <= std::numeric_limits<int>::max() &&
          vss_fseek(show_.file, static_cast<long>(distance), whence) == 0;
  return good_;
}

bool ContainerSession::seek(int64_t position) {
  return move(position, SEEK_SET);
}

bool ContainerSession::skip(int64_t bytes) {
  return move(bytes, SEEK_CUR);
}

int64_t ContainerSession::seek_end() {
  if (!move(0, SEEK_END)) return -1;
  const int64_t length = vss_ftell(show_.file);
  good_ = length >= 0 && length <= std::numeric_limits<int>::max();
  return good_ ? length : -1;
}

// A transfer of nothing is a failure: it comes only from a picture without data.
bool ContainerSession::read(void* destination, int64_t bytes) {
  if (!good_) return false;
  const auto count = static_cast<size_t>(bytes);
  good_ = bytes > 0 && vss_fread(destination, 1, count, show_.file) == count;
  return good_;
}

bool ContainerSession::write(const void* source, int64_t bytes) {
  if (!good_) return false;
  const auto count = static_cast<size_t>(bytes);
  good_ = bytes > 0 && vss_fwrite(source, 1, count, show_.file) == count;
  return good_;
}

bool ContainerSession::flush() {
  if (good_) good_ = vss_fflush(show_.file) == 0;
  return good_;
}

}  // namespace pelo::slideshow
