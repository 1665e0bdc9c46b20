#include "jni/show_table.h"

#include <cstring>
#include <new>

namespace pelo::bridge {

SlideShow* gShowTable = nullptr;
int gShowCount = 0;
int gShowTableMissing = 1;

namespace {

bool in_use(int slot) {
  return gShowTable[slot].mode != SlideShow::kFree;
}

}  // namespace

bool provide_table() {
  if (gShowTableMissing == 0) return true;
  gShowTable = new (std::nothrow) SlideShow[kSlots];
  if (gShowTable == nullptr) return false;
  gShowTableMissing = 0;
  return true;
}

// The language destroys an array's elements from the last to the first.
void destroy_table() {
  delete[] gShowTable;
  gShowTable = nullptr;
  gShowTableMissing = 1;
  gShowCount = 0;
}

int first_free_slot() {
  int slot = 0;
  while (slot < kSlots && in_use(slot)) ++slot;
  return slot;
}

// A show in memory has no path, and an empty one names no show.
int slot_for_path(const char* path) {
  int slot = 0;
  while (slot < kSlots && in_use(slot)) {
    if (*path != '\0' && std::strcmp(gShowTable[slot].pathName, path) == 0) break;
    ++slot;
  }
  return slot;
}

int admit(int slot, int result) {
  if (result != 1) return result;
  ++gShowCount;
  return slot;
}

int delete_show(int handle) {
  const bool named = gShowCount > 0 && handle >= 0 && handle <= gShowCount && handle < kSlots;
  if (!named || !in_use(handle)) return SlideShow::kBadHandle;
  --gShowCount;
  return gShowTable[handle].DeleteShow();
}

SlideShow* slot_of(int handle) {
  return handle >= 0 && handle < gShowCount ? gShowTable + handle : nullptr;
}

}  // namespace pelo::bridge
