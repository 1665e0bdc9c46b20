#include "codec/formats/gif/record.h"

using namespace pelo;
using namespace pelo::gif;

Record* PELOI_CreateGIFDecoderInfo(void) {
  auto record = os_new<Record>();
  if (record == nullptr) return nullptr;
  record->kind = Record::kKind;
  record->control.transparentIndex = -1;
  return record.release();
}

void PELOI_DelGIFDecoderInfo(Record* record) {
  OsDelete{}(record);
}

namespace pelo::gif {

bool IndexPlane::allocate(Size wanted) {
  size = wanted;
  const int64_t pixels = int64_t{wanted.width} * wanted.height;
  if (pixels == 0) return true;
  return pixels <= kMaxPictureBlock && indices.allocate(static_cast<size_t>(pixels)) &&
         painted.allocate(static_cast<size_t>(wanted.height));
}

}  // namespace pelo::gif
