// The thumbnail that an EXIF segment describes in IFD1: where it is, and how large.
#include <climits>
#include <cstddef>

#include "codec/formats/jpeg/exif/exif_members.h"
#include "codec/formats/jpeg/header_scan.h"

namespace pelo::jpeg {

static_assert(sizeof(TAVIRPELO_EXIFTHUMBNAIL) == 40 && offsetof(TAVIRPELO_EXIFTHUMBNAIL, length) == 20 &&
              offsetof(TAVIRPELO_EXIFTHUMBNAIL, offset) == 32);

namespace {

using Thumbnail = TAVIRPELO_EXIFTHUMBNAIL;

// Values of the compression member; others are tag 259's.
constexpr uint32_t kStrips = 0;
constexpr uint32_t kJpeg = 6;

// Positions in a source have 31 bits; 0 for what lies beyond.
bool store_offset(Thumbnail& thumbnail, const Field& field, const tiff::Structure& tiff) {
  const uint64_t offset = uint64_t{tiff.base} + field.number;
  thumbnail.offset = offset <= INT_MAX ? static_cast<uint32_t>(offset) : 0;
  return true;
}

bool store_jpeg_offset(Thumbnail& thumbnail, const Field& field, const tiff::Structure& tiff) {
  if (tiff.holds(field.number, 0)) {
    jpeg_size(tiff.data + field.number, tiff.size - field.number, &thumbnail.width, &thumbnail.height);
  }
  return store_offset(thumbnail, field, tiff);
}

template <uint32_t Compression>
bool store_length(Thumbnail& thumbnail, const Field& field, const tiff::Structure&) {
  thumbnail.compression = Compression;
  thumbnail.length = field.number;
  return true;
}

constexpr Member<Thumbnail> kThumbnailMembers[] = {
    {256, kShortOrLong, 1, number<&Thumbnail::width>},
    {257, kShortOrLong, 1, number<&Thumbnail::height>},
    {259, kShort, 1, number<&Thumbnail::compression>},
    {262, kShort, 1, number<&Thumbnail::photometric>},
    {273, kShortOrLong, kAnyCount, store_offset},
    {279, kShortOrLong, kAnyCount, store_length<kStrips>},
    {284, kShort, 1, number<&Thumbnail::planarConfig>},
    {513, kLong, 1, store_jpeg_offset},
    {514, kLong, 1, store_length<kJpeg>},
    {4173, kShort, 1, number<&Thumbnail::tag4173>},
};

bool read_frame_size(PELOJ_SOURCE& source, uint32_t& width, uint32_t& height) {
  FrameHead head;
  uint32_t remaining;
  if (!read_frame_head(source, head, remaining) || head.precision != 8) return false;
  height = static_cast<uint32_t>(head.height);
  width = static_cast<uint32_t>(head.width);
  return source_skip(source, remaining);
}

// Walks to the first scan; false when the data ends before it.
bool read_resolution(PELOJ_SOURCE& source, uint32_t& width, uint32_t& height) {
  uint8_t code;
  while (next_marker(source, code)) {
    const Marker marker{code};
    if (marker == Marker::kSos) return true;
    if (marker == Marker::kSof0 || marker == Marker::kSof2) {
      if (!read_frame_size(source, width, height)) return false;
    } else if (has_segment(marker) && !skip_segment(source)) {
      return false;
    }
  }
  return false;
}

}  // namespace

int jpeg_size(const uint8_t* data, uint32_t size, uint32_t* width, uint32_t* height) {
  if (size < 2 || size > INT_MAX || data[0] != 0xFF || data[1] != static_cast<uint8_t>(Marker::kSoi)) {
    return PELOJ_FAIL;
  }
  TAVIRPELO_IO io{};
  io.ioType = TAVIRPELO_IO_MEMORY;
  io.pSource = const_cast<uint8_t*>(data);
  io.size = static_cast<int>(size);
  io.position = 2;
  uint8_t window[kSourceBufferSize];
  PELOJ_SOURCE source{&io, 2, size, 0, 0, window};
  uint32_t seenWidth = 0;
  uint32_t seenHeight = 0;
  if (!read_resolution(source, seenWidth, seenHeight)) return PELOJ_FAIL;
  *width = seenWidth;
  *height = seenHeight;
  return PELOJ_OK;
}

void read_thumbnail_directory(const tiff::Structure& tiff, uint32_t offset,
                              TAVIRPELO_EXIFTHUMBNAIL& thumbnail) {
  walk_directory(tiff, offset, [&](const Field& field) {
    return store_field<Thumbnail>(kThumbnailMembers, thumbnail, field, tiff);
  });
  thumbnail.present = thumbnail.length != 0;
}

}  // namespace pelo::jpeg
