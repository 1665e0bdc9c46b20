#include "slideshow/picture_intake.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstdlib>

#include "slideshow/container_format.h"
#include "slideshow/subfile_table.h"

namespace pelo::slideshow {
namespace {

constexpr int kStoredQuality = 100;

DecInfo open(const PictureSource& source) {
  constexpr int kFormat = TAVIRPELO_RGB888;
  return DecInfo(
      source.path != nullptr
          ? TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_FILE, const_cast<char*>(source.path), 0, kFormat, 0)
          : TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, source.data, source.length, kFormat, 0));
}

// The source's size; a picture stored bottom up and one stored top down have the same.
bool measure(TAVIRPELO_DECINFO* decInfo, subfileInfo& entry) {
  TAVIRPELO_HINFO header;
  const int format = TAVIRPELO_Parser(decInfo, &header);
  if (format == TAVIRPELO_FORMAT_UNKNOWN || header.height == INT_MIN) return false;
  entry.width = header.width;
  entry.height = std::abs(header.height);
  return true;
}

// The picture at its display size; null when it cannot be decoded or memory is short.
RawImage decode(TAVIRPELO_DECINFO* decInfo, const DisplaySize& size) {
  RawImage raw(TAVIRPELO_CreateRawInfo(size.width, size.height, TAVIRPELO_RGB888));
  if (!raw || TAVIRPELO_DecodeParsed(decInfo, raw->pData, size.width, size.height) == 0) return nullptr;
  return raw;
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

bool make_picture(const SlideShow& show, const PictureSource& source, const char* name, char flag,
                  subfileInfo& entry, JpegBytes& jpeg) {
  entry.flag = static_cast<unsigned char>(flag);
  if (name != nullptr) set_text(entry.name, name);
  if (source.path != nullptr) set_text(entry.path, source.path);
  DecInfo decInfo = open(source);
  if (!decInfo || !measure(decInfo.get(), entry)) return false;
  if (show.mode == SlideShow::kMemoryMode) return true;

  const RawImage raw = decode(decInfo.get(), display_size(show, entry));
  decInfo.reset();  // the encoder's memory takes the place of the decoder's
  return raw && encode(show, *raw, entry, jpeg);
}

}  // namespace pelo::slideshow
