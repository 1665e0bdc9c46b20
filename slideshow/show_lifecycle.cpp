// Creating and ending a show, and the facts that need no file.
#include <cstddef>
#include <memory>
#include <type_traits>

#include "slideshow/SlideShow.h"
#include "slideshow/container_format.h"
#include "slideshow/subfile_table.h"
#include "slideshow/vss_wrappers.h"

using namespace pelo::slideshow;

// The table is a plain block of records: it is copied about and freed without destructors.
static_assert(std::is_trivially_copyable_v<subfileInfo>);
static_assert(std::is_trivially_destructible_v<subfileInfo>);
static_assert(sizeof(void*) != 4 ||
              (sizeof(subfileInfo) == 544 && offsetof(subfileInfo, offset) == 540));
static_assert(sizeof(void*) != 4 ||
              (sizeof(SlideShow) == 644 && offsetof(SlideShowFields, subfileOffsets) == 540));

SlideShow::~SlideShow() {
  reset();
}

int SlideShow::DeleteShow() {
  reset();
  return 1;
}

void SlideShow::reset() {
  vss_free(subfiles);
  static_cast<SlideShowFields&>(*this) = SlideShowFields{};
}

bool SlideShow::allocateEntries(int count) {
  vss_free(subfiles);
  subfiles = static_cast<subfileInfo*>(vss_malloc(static_cast<size_t>(count) * sizeof(subfileInfo)));
  if (subfiles == nullptr) return false;
  std::uninitialized_value_construct_n(subfiles, count);
  return true;
}

namespace {

// Removes an existing file and tells how to open the new one. A file that is there but cannot be changed
// is opened for appending, where the writer finds it not empty and refuses.
const char* make_way(const char* path) {
  FILE* existing = vss_fopen(path, "r+b");
  if (existing == nullptr) return "a+b";
  (void)vss_fclose(existing);
  (void)vss_unlink(path);
  return "w+b";
}

}  // namespace

int SlideShow::CreateShow(const char* path, int showWidth, int showHeight) {
  if (showWidth < 1 || showHeight < 1) return 0;
  width = showWidth;
  height = showHeight;
  if (path != nullptr && !usable_path(path)) return 0;

  char ownPath[kTextSize] = {};  // `path` may lie in this object
  if (path != nullptr) set_text(ownPath, path);
  reset();
  width = showWidth;
  height = showHeight;
  const bool created = [&] {
    if (path == nullptr) {
      mode = kMemoryMode;
      return allocateEntries(kMaxMemorySubfiles);
    }
    mode = kFileMode;
    set_text(pathName, ownPath);
    return allocateEntries(kMaxFileSubfiles) && writeVssHeader(make_way(pathName)) == 1;
  }();
  if (!created) {
    reset();
    return kGeneralFailure;
  }
  return 1;
}

int SlideShow::SetPathName(const char* path) {
  if (mode != kFileMode || !usable_path(path)) return 0;
  set_text(pathName, path);
  return writeVssHeader("r+b");
}

int SlideShow::GetLastInformation(char* buffer) const {
  if (buffer == nullptr) return 0;
  if (mode == kFileMode) return copy_text(buffer, pathName);
  if (mode == kMemoryMode && valid_index(*this, lastIndex)) {
    return copy_text(buffer, subfiles[lastIndex].path);
  }
  return 0;
}

int SlideShow::GetMusicSize() const {
  return mode == kFree ? 0 : musicSize;
}

int SlideShow::GetSizeOfSubfile(int index) const {
  return valid_index(*this, index) ? subfiles[index].size - kSubfileHeaderSize : 0;
}
