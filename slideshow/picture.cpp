#include "slideshow/picture.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstdlib>

#include "slideshow/container_format.h"
#include "slideshow/text_field.h"
#include "tavirpelo/tavirpelo.h"

namespace pelo::slideshow {
namespace {

constexpr int kStoredQuality = 100;

struct DestroyRaw {
  void operator()(TAVIRPELO_RAWINFO* raw) const { TAVIRPELO_DestroyRawInfo(raw); }
};
using RawImage = std::unique_ptr<TAVIRPELO_RAWINFO, DestroyRaw>;

// The source's size; a picture stored bottom up and one stored top down have the same.
bool measure(const PictureSource& source, subfileInfo& entry) {
  TAVIRPELO_HINFO header;
  const int format = source.path != nullptr
                         ? TAVIRPELO_ParseFromFile(source.path, &header)
                         : TAVIRPELO_ParseFromBuffer(source.data, source.length, &header);
  if (format == TAVIRPELO_FORMAT_UNKNOWN || header.height == INT_MIN) return false;
  entry.width = header.width;
  entry.height = std::abs(header.height);
  return true;
}

bool decode(const PictureSource& source, TAVIRPELO_RAWINFO* raw) {
  if (source.path != nullptr) return TAVIRPELO_DecodeImageFromFile(source.path, raw, 0) != 0;
  return TAVIRPELO_DecodeImageFromBuffer(source.data, source.length, raw, 0) != 0;
}

// A first guess at the JPEG's size; the encoder enlarges it when needed.
int first_capacity(const SlideShow& show) {
  const int64_t tenth = int64_t{show.width} * show.height / 10;
  return static_cast<int>(std::clamp<int64_t>(tenth, 1024, 1 << 24));
}

// Encodes and reads back what became of it.
bool encode(const SlideShow& show, const TAVIRPELO_RAWINFO& raw, subfileInfo& entry, JpegBytes& jpeg) {
  int size = first_capacity(show);
  auto* buffer = static_cast<uint8_t*>(vss_malloc(static_cast<size_t>(size)));
  if (buffer == nullptr) return false;
  const int encoded = TAVIRPELO_EncodeJpegToBuffer(&raw, &buffer, &size, kStoredQuality);
  jpeg.reset(buffer);
  TAVIRPELO_HINFO header;
  if (!encoded || TAVIRPELO_ParseFromBuffer(buffer, size, &header) != TAVIRPELO_FORMAT_JPEG ||
      size > INT_MAX - kSubfileHeaderSize) {
    return false;
  }
  entry.width = header.width;
  entry.height = header.height;
  entry.size = kSubfileHeaderSize + size;
  return true;
}

}  // namespace

DisplaySize display_size(const SlideShow& show, const subfileInfo& entry) {
  const auto scaled = [](int64_t limit, int other, int side) {
    return side == 0 ? 0 : static_cast<int>(limit * other / side);
  };
  const int w = entry.width;
  const int h = entry.height;
  if (w >= h) return {std::min(w, show.width), w <= show.width ? h : scaled(show.width, h, w)};
  return {h <= show.height ? w : scaled(show.height, w, h), std::min(h, show.height)};
}

bool make_picture(const SlideShow& show, const PictureSource& source, const char* name, char flag,
                  subfileInfo& entry, JpegBytes& jpeg) {
  entry.flag = static_cast<unsigned char>(flag);
  if (name != nullptr) set_text(entry.name, name);
  if (source.path != nullptr) set_text(entry.path, source.path);
  if (!measure(source, entry)) return false;
  if (show.mode == SlideShow::kMemoryMode) return true;

  const DisplaySize size = display_size(show, entry);
  const RawImage raw(TAVIRPELO_CreateRawInfo(size.width, size.height, TAVIRPELO_RGB888));
  return raw && decode(source, raw.get()) && encode(show, *raw, entry, jpeg);
}

}  // namespace pelo::slideshow
