// The TIFF structure that EXIF needs around an orientation, a few strings and a thumbnail, and the APP1
// segment that carries it.
#include "codec/formats/jpeg/exif/exif_writer.h"

#include <algorithm>
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/formats/jpeg/exif/exif_reader.h"
#include "codec/formats/jpeg/marker_codes.h"

namespace pelo::jpeg {
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
  write_le16(entry, tag);
  write_le16(entry + 2, type);
  write_le32(entry + 4, count);
  write_le32(entry + 8, field);
  return entry + tiff::kEntrySize;
}

// 282, 283 and 296, which both directories have.
uint8_t* put_resolution(uint8_t* entry, uint8_t* base, uint32_t* position) {
  entry = write_rational_tag(entry, base, position, 282, kDpi, 1);
  entry = write_rational_tag(entry, base, position, 283, kDpi, 1);
  return write_short_tag(entry, 296, kInch);
}

// IFD0; returns where its values end.
uint32_t put_image_directory(uint8_t* base, const ELO_EXIFCONTENT& content) {
  uint8_t* const directory = base + tiff::kHeaderSize;
  uint32_t position = tiff::kHeaderSize + directory_size(kImageEntries);
  write_le16(directory, kImageEntries);
  uint8_t* entry = directory + 2;
  entry = write_ascii_tag(entry, base, &position, 271, content.make);
  entry = write_ascii_tag(entry, base, &position, 272, content.model);
  entry = write_short_tag(entry, 274, content.orientation);
  entry = put_resolution(entry, base, &position);
  entry = write_ascii_tag(entry, base, &position, 306, content.dateTime);
  entry = write_short_tag(entry, 531, kCosited);
  write_le32(entry, content.thumbnail == nullptr ? 0 : position);
  return position;
}

// IFD1 at `start` and the thumbnail behind it; returns where that ends.
uint32_t put_thumbnail_directory(uint8_t* base, uint32_t start, const ELO_EXIFCONTENT& content) {
  uint32_t position = start + directory_size(kThumbnailEntries);
  const uint32_t data = position + kRationals;
  write_le16(base + start, kThumbnailEntries);
  uint8_t* entry = base + start + 2;
  entry = write_short_tag(entry, 259, kJpeg);
  entry = put_resolution(entry, base, &position);
  entry = write_long_tag(entry, 513, data);
  entry = write_long_tag(entry, 514, content.thumbnailLength);
  entry = write_short_tag(entry, 531, kCosited);
  write_le32(entry, 0);
  std::memcpy(base + data, content.thumbnail, content.thumbnailLength);
  return data + content.thumbnailLength;
}

// The whole structure; 0 when it exceeds `capacity`.
uint32_t put_structure(uint8_t* tiff, const ELO_EXIFCONTENT& content, uint32_t capacity) {
  if (exif_size(content) > capacity) return 0;
  tiff[0] = tiff[1] = 'I';
  write_le16(tiff + 2, 42);
  write_le32(tiff + 4, tiff::kHeaderSize);
  const uint32_t end = put_image_directory(tiff, content);
  return content.thumbnail == nullptr ? end : put_thumbnail_directory(tiff, end, content);
}

}  // namespace

void write_le32(uint8_t* dst, uint32_t value) {
  store_le32(dst, value);
}

void write_le16(uint8_t* dst, uint32_t value) {
  store_le16(dst, value);
}

uint32_t write_text(uint8_t* dst, const char* text) {
  const size_t size = std::strlen(text) + 1;
  std::memcpy(dst, text, size);
  return static_cast<uint32_t>(size);
}

uint8_t* write_short_tag(uint8_t* entry, uint16_t tag, uint32_t value) {
  return put_entry(entry, tag, tiff::kShort, 1, value & 0xFFFF);
}

uint8_t* write_long_tag(uint8_t* entry, uint16_t tag, uint32_t value) {
  return put_entry(entry, tag, tiff::kLong, 1, value);
}

uint8_t* write_rational_tag(uint8_t* entry, uint8_t* base, uint32_t* position, uint16_t tag,
                            uint32_t numerator, uint32_t denominator) {
  const uint32_t offset = *position;
  write_le32(base + offset, numerator);
  write_le32(base + offset + 4, denominator);
  *position += 8;
  return put_entry(entry, tag, tiff::kRational, 1, offset);
}

uint8_t* write_ascii_tag(uint8_t* entry, uint8_t* base, uint32_t* position, uint16_t tag,
                         const char* text) {
  if (text == nullptr) return put_entry(entry, tag, tiff::kAscii, 0, 0);
  const uint32_t offset = *position;
  const uint32_t size = write_text(base + offset, text);
  *position += size;
  return put_entry(entry, tag, tiff::kAscii, size, offset);
}

uint32_t create_exif(uint8_t* tiff, const ELO_EXIFCONTENT* content) {
  return tiff == nullptr || content == nullptr ? 0 : put_structure(tiff, *content, kMaxTiff);
}

uint32_t write_exif_segment(uint8_t* segment, const ELO_EXIFCONTENT& content, uint32_t capacity) {
  if (capacity < kSegmentHead) return 0;
  const uint32_t room = std::min(capacity - kSegmentHead, kMaxTiff);
  const uint32_t length = put_structure(segment + kSegmentHead, content, room);
  if (length == 0) return 0;
  segment[0] = 0xFF;
  segment[1] = static_cast<uint8_t>(Marker::kApp1);
  store_be16(segment + 2, length + kSegmentHead - 2);
  std::memcpy(segment + 4, "Exif\0", kExifIdentifierSize);
  return length + kSegmentHead;
}

int make_app1(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_APP1* app1) {
  if (app1 == nullptr || app1->data == nullptr) return 0;
  TAVIRPELO_EXIFINFO* info = create_info(decInfo);
  if (info == nullptr) return 0;
  ELO_EXIFCONTENT content{};
  content.orientation = info->orientation;
  destroy_info(info);
  // The encoder only reads a segment, hence its const; here the same descriptor names what to fill.
  auto* segment = const_cast<uint8_t*>(app1->data);
  app1->length = static_cast<int>(write_exif_segment(segment, content, PELO_APP1_SIZE));
  return 1;
}

}  // namespace pelo::jpeg
