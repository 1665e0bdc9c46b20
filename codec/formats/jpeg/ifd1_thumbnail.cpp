#include "codec/formats/jpeg/ifd1_thumbnail.h"

#include <climits>
#include <cstddef>

#include "codec/formats/jpeg/header_scan.h"

namespace pelo::jpeg {

using Thumbnail = TAVIRPELO_EXIFTHUMBNAIL;

static_assert(sizeof(Thumbnail) == 40 && offsetof(Thumbnail, length) == 20 &&
              offsetof(Thumbnail, offset) == 32);

namespace {

using enum ThumbnailPart;

constexpr uint32_t kShort = 1u << tiff::kShort;
constexpr uint32_t kLong = 1u << tiff::kLong;

constexpr ThumbnailTag kTags[] = {
    {256, kShort | kLong, 1, kNumber, &Thumbnail::width},
    {257, kShort | kLong, 1, kNumber, &Thumbnail::height},
    {259, kShort, 1, kNumber, &Thumbnail::compression},
    {262, kShort, 1, kNumber, &Thumbnail::photometric},
    {273, kShort | kLong, 0, kStripOffset, &Thumbnail::offset},
    {279, kShort | kLong, 0, kStripLength, &Thumbnail::length},
    {284, kShort, 1, kNumber, &Thumbnail::planarConfig},
    {513, kLong, 1, kJpegOffset, &Thumbnail::offset},
    {514, kLong, 1, kJpegLength, &Thumbnail::length},
    {4173, kShort, 1, kNumber, &Thumbnail::tag4173},
};

}  // namespace

const ThumbnailTag* thumbnail_tag(uint16_t tag) {
  for (const ThumbnailTag& known : kTags) {
    if (known.tag == tag) return &known;
  }
  return nullptr;
}

bool store_thumbnail(Thumbnail& thumbnail, const ThumbnailTag& tag, uint32_t value, int64_t base) {
  thumbnail.*tag.member = value;
  switch (tag.part) {
    case kStripLength:
      thumbnail.compression = PELOJ_THUMBNAIL_STRIP;
      return true;
    case kJpegLength:
      thumbnail.compression = PELOJ_THUMBNAIL_JPEG;
      return true;
    case kStripOffset:
    case kJpegOffset:
      thumbnail.offset = static_cast<uint32_t>(base + value);
      return base + value <= INT_MAX;  // positions in a source have 31 bits
    default:
      return true;
  }
}

}  // namespace pelo::jpeg
