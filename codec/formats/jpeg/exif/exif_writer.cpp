// The TIFF structure that EXIF needs around an orientation, a few strings and a thumbnail, and the APP1
// segment that carries it.
#include "codec/formats/jpeg/exif/exif_writer.h"

#include <algorithm>
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/formats/jpeg/exif/exif_reader.h"
#include "codec/formats/jpeg/marker_codes.h"

using namespace pelo;
using namespace pelo::jpeg;

namespace {

constexpr uint32_t kImageEntries = 8;
constexpr uint32_t kThumbnailEntries = 7;
constexpr uint32_t kRationals = 2 * 8;  // bytes of a directory's two resolutions
constexpr uint32_t kDpi = 72;
constexpr uint32_t kInch = 2;
constexpr uint32_t kCosited = 2;
constexpr uint32_t kJpeg = 6;

// A segment's length has 16 bits and counts all but the marker.
constexpr uint32_t kSegmentHead = 4 + kExifIdentifierSize;
constexpr uint32_t kMaxTiff = 0xFFFF + 2 - kSegmentHead;

// Bytes from a directory's start to the values behind it: count, entries, offset of the next directory.
constexpr uint32_t directory_size(uint32_t entries) {
  return 2 + entries * tiff::kEntrySize + 4;
}
static_assert(tiff::kHeaderSize + directory_size(kImageEntries) == 110);
static_assert(directory_size(kThumbnailEntries) == 90);

uint64_t text_size(const char* text) {
  return text == nullptr ? 0 : uint64_t{std::strlen(text)} + 1;
}

uint64_t exif_size(const ELO_EXIFCONTENT& content) {
  uint64_t size = tiff::kHeaderSize + directory_size(kImageEntries) + kRationals;
  for (const char* text : {content.make, content.model, content.dateTime}) size += text_size(text);
  if (content.thumbnail != nullptr) {
    size += directory_size(kThumbnailEntries) + kRationals + uint64_t{content.thumbnailLength};
  }
  return size;
}

uint8_t* put_entry(uint8_t* entry, uint16_t tag, tiff::Type type, uint32_t count, uint32_t field) {
  __elo_WriteSHORT_LE(entry, tag);
  __elo_WriteSHORT_LE(entry + 2, type);
  __elo_WriteLONG_LE(entry + 4, count);
  __elo_WriteLONG_LE(entry + 8, field);
  return entry + tiff::kEntrySize;
}

// 282, 283 and 296, which both directories have.
uint8_t* put_resolution(uint8_t* entry, uint8_t* base, uint32_t* position) {
  entry = __elo_WriteRATIONALTag(entry, base, position, 282, kDpi, 1);
  entry = __elo_WriteRATIONALTag(entry, base, position, 283, kDpi, 1);
  return __elo_WriteSHORTTag(entry, 296, kInch);
}

// IFD0; returns where its values end.
uint32_t put_image_directory(uint8_t* base, const ELO_EXIFCONTENT& content) {
  uint8_t* const directory = base + tiff::kHeaderSize;
  uint32_t position = tiff::kHeaderSize + directory_size(kImageEntries);
  __elo_WriteSHORT_LE(directory, kImageEntries);
  uint8_t* entry = directory + 2;
  entry = __elo_WriteASCIITag(entry, base, &position, 271, content.make);
  entry = __elo_WriteASCIITag(entry, base, &position, 272, content.model);
  entry = __elo_WriteSHORTTag(entry, 274, content.orientation);
  entry = put_resolution(entry, base, &position);
  entry = __elo_WriteASCIITag(entry, base, &position, 306, content.dateTime);
  entry = __elo_WriteSHORTTag(entry, 531, kCosited);
  __elo_WriteLONG_LE(entry, content.thumbnail == nullptr ? 0 : position);
  return position;
}

// IFD1 at `start` and the thumbnail behind it; returns where that ends.
uint32_t put_thumbnail_directory(uint8_t* base, uint32_t start, const ELO_EXIFCONTENT& content) {
  uint32_t position = start + directory_size(kThumbnailEntries);
  const uint32_t data = position + kRationals;
  __elo_WriteSHORT_LE(base + start, kThumbnailEntries);
  uint8_t* entry = base + start + 2;
  entry = __elo_WriteSHORTTag(entry, 259, kJpeg);
  entry = put_resolution(entry, base, &position);
  entry = __elo_WriteLONGTag(entry, 513, data);
  entry = __elo_WriteLONGTag(entry, 514, content.thumbnailLength);
  entry = __elo_WriteSHORTTag(entry, 531, kCosited);
  __elo_WriteLONG_LE(entry, 0);
  std::memcpy(base + data, content.thumbnail, content.thumbnailLength);
  return data + content.thumbnailLength;
}

// The whole structure; 0 when it exceeds `capacity`.
uint32_t create_exif(uint8_t* tiff, const ELO_EXIFCONTENT& content, uint32_t capacity) {
  if (exif_size(content) > capacity) return 0;
  tiff[0] = tiff[1] = 'I';
  __elo_WriteSHORT_LE(tiff + 2, 42);
  __elo_WriteLONG_LE(tiff + 4, tiff::kHeaderSize);
  const uint32_t end = put_image_directory(tiff, content);
  return content.thumbnail == nullptr ? end : put_thumbnail_directory(tiff, end, content);
}

}  // namespace

void __elo_WriteLONG_LE(uint8_t* dst, uint32_t value) {
  store_le32(dst, value);
}

void __elo_WriteSHORT_LE(uint8_t* dst, uint32_t value) {
  store_le16(dst, value);
}

uint32_t __elo_WriteASCII_String(uint8_t* dst, const char* text) {
  const size_t size = std::strlen(text) + 1;
  std::memcpy(dst, text, size);
  return static_cast<uint32_t>(size);
}

uint8_t* __elo_WriteSHORTTag(uint8_t* entry, uint16_t tag, uint32_t value) {
  return put_entry(entry, tag, tiff::kShort, 1, value & 0xFFFF);
}

uint8_t* __elo_WriteLONGTag(uint8_t* entry, uint16_t tag, uint32_t value) {
  return put_entry(entry, tag, tiff::kLong, 1, value);
}

uint8_t* __elo_WriteRATIONALTag(uint8_t* entry, uint8_t* base, uint32_t* position, uint16_t tag,
                                uint32_t numerator, uint32_t denominator) {
  const uint32_t offset = *position;
  __elo_WriteLONG_LE(base + offset, numerator);
  __elo_WriteLONG_LE(base + offset + 4, denominator);
  *position += 8;
  return put_entry(entry, tag, tiff::kRational, 1, offset);
}

uint8_t* __elo_WriteASCIITag(uint8_t* entry, uint8_t* base, uint32_t* position, uint16_t tag,
                             const char* text) {
  if (text == nullptr) return put_entry(entry, tag, tiff::kAscii, 0, 0);
  const uint32_t offset = *position;
  const uint32_t size = __elo_WriteASCII_String(base + offset, text);
  *position += size;
  return put_entry(entry, tag, tiff::kAscii, size, offset);
}

uint32_t __elo_CreateExif(uint8_t* tiff, const ELO_EXIFCONTENT* content) {
  return tiff == nullptr || content == nullptr ? 0 : create_exif(tiff, *content, kMaxTiff);
}

uint32_t pelo::jpeg::write_exif_segment(uint8_t* segment, const ELO_EXIFCONTENT& content,
                                        uint32_t capacity) {
  if (capacity < kSegmentHead) return 0;
  const uint32_t room = std::min(capacity - kSegmentHead, kMaxTiff);
  const uint32_t length = create_exif(segment + kSegmentHead, content, room);
  if (length == 0) return 0;
  segment[0] = 0xFF;
  segment[1] = static_cast<uint8_t>(Marker::kApp1);
  store_be16(segment + 2, length + kSegmentHead - 2);
  std::memcpy(segment + 4, "Exif\0", kExifIdentifierSize);
  return length + kSegmentHead;
}

int pelo_get_app1_mark(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_APP1* app1) {
  if (app1 == nullptr || app1->data == nullptr) return 0;
  TAVIRPELO_EXIFINFO* info = PELOJ_CreatExifInfo(decInfo);
  if (info == nullptr) return 0;
  ELO_EXIFCONTENT content{};
  content.orientation = info->orientation;
  PELOJ_DestroyExifInfo(info);
  // The encoder only reads a segment, hence its const; here the same descriptor names what to fill.
  auto* segment = const_cast<uint8_t*>(app1->data);
  app1->length = static_cast<int>(write_exif_segment(segment, content, PELO_APP1_SIZE));
  return 1;
}
