#include "codec/formats/gif/record.h"

#include "codec/formats/format.h"

namespace pelo::gif {

Record* new_record(void) {
  auto record = os_new<Record>();
  if (record == nullptr) return refuse(Reason::kNoMemory, "GIF decoder"), nullptr;
  record->kind = Record::kKind;
  record->control.transparentIndex = -1;
  return record.release();
}

void delete_record(Record* record) {
  OsDelete{}(record);
}

bool IndexPlane::allocate(Size wanted) {
  size = wanted;
  const int64_t pixels = int64_t{wanted.width} * wanted.height;
  if (pixels == 0) return true;
  return obtain_block(pixels, "GIF picture", [&] {
    return indices.allocate(static_cast<size_t>(pixels)) &&
           painted.allocate(static_cast<size_t>(wanted.height));
  });
}

}  // namespace pelo::gif
