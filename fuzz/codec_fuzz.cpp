// A fuzz target over every entry of the codec that takes foreign bytes. The first eight bytes of an
// input choose the entry, output format, size and options; the rest is the file.
#include <algorithm>
#include <cstdint>
#include <cstring>
#include <vector>

#include "codec/base/byte_order.h"
#include "codec/formats/png/png_abi.h"
#include "codec/formats/png/png_info.h"
#include "codec/pixel/packers.h"
#include "platform/android_log.h"
#include "tavirpelo/tavirpelo.h"

namespace {

using Bytes = std::vector<uint8_t>;

struct Request {
  int entry, format, width, height;
  uint32_t option;
  int lines;
};

// A pixel buffer of exactly the size asked for, so that any byte beyond is noticed.
Bytes pixels_for(const Request& r, int rows) {
  return Bytes(static_cast<size_t>(r.width) * static_cast<size_t>(rows) *
               static_cast<size_t>(std::max(1, pelo::bytes_per_pixel(r.format))));
}

// Mutations would stop at the first checksum of a PNG.
void repair_checksums(Bytes& file) {
  if (file.size() < 8 || file[1] != 'P') return;
  for (size_t at = 8; at + 12 <= file.size();) {
    const uint64_t length = pelo::load_be32(&file[at]);
    if (length == 0 || at + 12 + length > file.size()) return;
    pelo::store_be32(&file[at + 8 + length],
                     __PELOI_PngCrc32(&file[at + 4], static_cast<uint32_t>(length) + 4));
    at += 12 + length;
  }
}

using Decode = int (*)(TAVIRPELO_DECINFO*, void*, int, int);
constexpr Decode kWhole[] = {TAVIRPELO_DecodeJPEG, TAVIRPELOI_DecodePNG, TAVIRPELOI_DecodeGIF,
                             TAVIRPELOI_DecodeBMP, TAVIRPELOI_DecodeWBMP};
constexpr Decode kSteps[] = {TAVIRPELOI_DecodePNGIter, TAVIRPELOI_DecodeGIFIter,
                             TAVIRPELOI_DecodeBMPIter, TAVIRPELOI_DecodeAGIF, TAVIRPELOI_DecodeAGIFIter};
using DecodeLines = int (*)(TAVIRPELO_DECINFO*, void*, int, int, int);
constexpr DecodeLines kLines[] = {TAVIRPELOI_DecodePNGLine, TAVIRPELOI_DecodeGIFLine,
                                  TAVIRPELOI_DecodeBMPLine};

void end(TAVIRPELO_DECINFO* decInfo) {
  TAVIRPELOI_AbortPNGIter(decInfo);
  TAVIRPELOI_AborAGIF(decInfo);
  TAVIRPELOI_AbortBMPIter(decInfo);
  TAVIRPELO_DestroyDecInfo(decInfo);
}

void decode(Bytes& file, const Request& r) {
  repair_checksums(file);
  TAVIRPELO_DECINFO* decInfo = TAVIRPELO_CreateDecInfo(
      TAVIRPELO_IO_MEMORY, file.data(), static_cast<int>(file.size()), r.format, r.option);
  if (decInfo == nullptr) return;
  TAVIRPELO_SetDecMode(decInfo, r.lines % 5);
  TAVIRPELO_Parser(decInfo, nullptr);
  Bytes pixels = pixels_for(r, r.height);
  const int entry = r.entry % 13;
  if (entry < 5) {
    kWhole[entry](decInfo, pixels.data(), r.width, r.height);
  } else if (entry < 10) {
    for (int i = 0, more = 1; more != 0 && more != 3 && i < 200; ++i) {
      more = kSteps[entry - 5](decInfo, pixels.data(), r.width, r.height);
      if (decInfo->pFormatInfo == nullptr) break;
    }
  } else {
    const DecodeLines lines = kLines[entry - 10];
    Bytes band = lines == TAVIRPELOI_DecodeBMPLine ? pixels_for(r, r.height) : pixels_for(r, r.lines);
    for (int i = 0; i < 200; ++i) {
      if (lines(decInfo, band.data(), r.width, r.height, r.lines) == 0 ||
          decInfo->pFormatInfo == nullptr)
        break;
    }
  }
  end(decInfo);
}

void decode_in_bands(Bytes& file, const Request& r) {
  TAVIRPELO_DECINFO* decInfo = TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, file.data(),
                                                       static_cast<int>(file.size()), 1, r.option);
  if (decInfo == nullptr) return;
  Bytes band(static_cast<size_t>(r.width) * static_cast<size_t>(r.lines) * 3);
  uint8_t* const planes[3] = {band.data(), nullptr, nullptr};
  PELOJ_JDINFO* state = __elo_jpeg_dec_line_init(decInfo, r.width, r.height, TAVIRPELO_RGB888);
  bool alive = state != nullptr;
  for (int row = 0; alive && row < r.height; row += r.lines) {
    alive = __elo_jpeg_dec_line_process(state, planes, std::min(r.lines, r.height - row)) == 1;
  }
  if (alive) __elo_jpeg_dec_line_finish(state);
  TAVIRPELO_DestroyDecInfo(decInfo);
}

void change(Bytes& file, const Request& r) {
  const auto size = static_cast<int>(file.size());
  TAVIRPELO_HINFO header{};
  if (TAVIRPELO_ParseFromBuffer(file.data(), size, &header) != TAVIRPELO_FORMAT_JPEG) return;
  if (int64_t{header.width} * header.height > 1 << 20) return;
  ELO_DESTINATION destination{ELO_TO_MEMORY, 0, 0, 0, nullptr, nullptr};
  elo_rotate_jpeg(file.data(), size, header.width, header.height, &destination, r.entry % 4 * 90,
                  r.lines & 1, nullptr);
  TAVIRPELO_OsFree(destination.buffer);
  int capacity = 1024;
  auto* buffer = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(1024));
  TAVIRPELO_ReEncodeJpegToBuffer(file.data(), size, 1, &buffer, &capacity, 400 + 40 * r.lines);
  TAVIRPELO_OsFree(buffer);
  TAVIRPELO_DestroyJpegExifInfo(TAVIRPELO_CreateJpegExifInfoFromBuffer(file.data(), size));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  constexpr size_t kHead = 8;
  if (size <= kHead) return 0;
  pelo::platform::set_log_sink([](const char*) {});
  const Request r{data[0],
                  data[1] % 13,
                  1 + data[2] % 100,
                  1 + data[3] % 100,
                  static_cast<uint32_t>(data[4] | data[5] << 8) & 0x37FF,
                  1 + data[6] % 40};
  Bytes file(data + kHead, data + size);
  switch (data[7] % 4) {
    case 0:
      decode_in_bands(file, r);
      break;
    case 1:
      change(file, r);
      break;
    default:
      decode(file, r);
      break;
  }
  return 0;
}
