// The thumbnail that the second directory of EXIF, IFD1, describes: one table of its tags and one
// record, for the header scans, which take whatever type an entry has, and for the EXIF reader, which
// insists on the types and counts of the standard.
#pragma once

#include <cstdint>

#include "codec/formats/jpeg/tiff.h"
#include "tavirpelo/exif.h"

namespace pelo::jpeg {

enum class ThumbnailPart : uint8_t { kNumber, kStripOffset, kStripLength, kJpegOffset, kJpegLength };

struct ThumbnailTag {
  uint16_t tag;
  uint32_t types;  // tiff::Type, a bit each
  uint32_t count;  // 0: any
  ThumbnailPart part;
  uint32_t TAVIRPELO_EXIFTHUMBNAIL::*member;

  bool standard(uint16_t type, uint32_t number) const {
    return (types >> type & 1) != 0 && (count == 0 || count == number);
  }
};

// Null for a tag that says nothing of the thumbnail.
[[nodiscard]] const ThumbnailTag* thumbnail_tag(uint16_t tag);

// Takes over an entry's value; offsets count from `base`, where the TIFF structure stands in its source.
// False for an offset that no source can have.
bool store_thumbnail(TAVIRPELO_EXIFTHUMBNAIL& thumbnail, const ThumbnailTag& tag, uint32_t value,
                     int64_t base);

}  // namespace pelo::jpeg
