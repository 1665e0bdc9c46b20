#include "tests/support/entries.h"

#include <algorithm>
#include <cstdlib>
#include <vector>

#include "codec/base/byte_order.h"
#include "codec/formats/png/png_abi.h"
#include "codec/pixel/row_stores.h"

namespace tests {
namespace {

// More than any sample needs; a decode that goes on longer does not end.
constexpr int kMostCalls = 5000;

int bounded(int calls, int answer) {
  if (calls >= kMostCalls) std::abort();
  return answer;
}

size_t row_bytes(const Request& r, int rows) {
  return static_cast<size_t>(r.width) * static_cast<size_t>(rows) *
         static_cast<size_t>(pelo::bytes_per_pixel(r.format));
}

template <auto Decode>
int whole(TAVIRPELO_DECINFO* d, uint8_t* pixels, const Request& r) {
  return Decode(d, pixels, r.width, r.height);
}

// Calls that go on while they answer 4, or 1 as a frame with successors does.
template <auto Decode, bool kFrames = false>
int repeated(TAVIRPELO_DECINFO* d, uint8_t* pixels, const Request& r) {
  int answer = 4, calls = 0;
  for (; (answer == 4 || (kFrames && answer == 1)) && calls < kMostCalls; ++calls)
    answer = Decode(d, pixels, r.width, r.height);
  return bounded(calls, answer);
}

// Calls for some rows each, as many as the decode takes: turned pictures have more rows than the buffer,
// which are not kept.
template <auto Decode>
int by_lines(TAVIRPELO_DECINFO* d, uint8_t* pixels, const Request& r) {
  int answer = 0, calls = 0;
  for (int row = 0; calls < kMostCalls; row += r.lines, ++calls) {
    const int rows = row < r.height ? std::min(r.lines, r.height - row) : r.lines;
    std::vector<uint8_t> band(row_bytes(r, rows));
    const size_t at = row_bytes(r, std::min(row, r.height)), kept = row < r.height ? band.size() : 0;
    std::copy_n(pixels + at, kept, band.begin());
    answer = Decode(d, band.data(), r.width, r.height, rows);
    std::copy_n(band.begin(), kept, pixels + at);
    if (d->pFormatInfo == nullptr) break;
  }
  return bounded(calls, answer);
}

// The same into the whole buffer each time.
template <auto Decode>
int by_lines_in_place(TAVIRPELO_DECINFO* d, uint8_t* pixels, const Request& r) {
  int answer = 0, calls = 0;
  do {
    answer = Decode(d, pixels, r.width, r.height, r.lines);
  } while (d->pFormatInfo != nullptr && ++calls < kMostCalls);
  return bounded(calls, answer);
}

int in_bands(TAVIRPELO_DECINFO* d, uint8_t* pixels, const Request& r) {
  PELOJ_JDINFO* state = __elo_jpeg_dec_line_init(d, r.width, r.height, r.format);
  if (state == nullptr) return 0;
  for (int row = 0; row < r.height; row += r.lines) {
    uint8_t* const planes[3] = {pixels + row_bytes(r, row), nullptr, nullptr};
    if (__elo_jpeg_dec_line_process(state, planes, std::min(r.lines, r.height - row)) == 0) return 0;
  }
  __elo_jpeg_dec_line_finish(state);
  return 1;
}

int parse(TAVIRPELO_DECINFO* d, uint8_t*, const Request&) {
  TAVIRPELO_HINFO header;
  return TAVIRPELO_Parser(d, &header);
}

int one_call(TAVIRPELO_DECINFO* d, uint8_t* pixels, const Request& r) {
  const auto bytes = memory_of(*d);
  TAVIRPELO_RAWINFO raw{static_cast<uint32_t>(r.width), static_cast<uint32_t>(r.height), pixels,
                        static_cast<uint32_t>(r.format)};
  return TAVIRPELO_DecodeImageFromBuffer(bytes.data(), static_cast<int>(bytes.size()), &raw, r.option);
}

// Large pictures take long and test nothing further.
bool small(const TAVIRPELO_HINFO& header) {
  return int64_t{header.width} * header.height <= 1 << 20;
}

int turned(TAVIRPELO_DECINFO* d, uint8_t*, const Request& r) {
  const auto bytes = memory_of(*d);
  const auto size = static_cast<int>(bytes.size());
  TAVIRPELO_HINFO header{};
  if (TAVIRPELO_ParseFromBuffer(bytes.data(), size, &header) != TAVIRPELO_FORMAT_JPEG) return 0;
  if (!small(header)) return 0;
  ELO_DESTINATION to{ELO_TO_MEMORY, 0, 0, 0, nullptr, nullptr};
  const int answer = elo_rotate_jpeg(bytes.data(), size, header.width, header.height, &to,
                                     r.lines % 4 * 90, r.lines / 4 % 2, nullptr);
  TAVIRPELO_OsFree(to.buffer);
  return answer;
}

int fitted(TAVIRPELO_DECINFO* d, uint8_t*, const Request& r) {
  const auto bytes = memory_of(*d);
  const auto size = static_cast<int>(bytes.size());
  TAVIRPELO_HINFO header{};
  TAVIRPELO_ParseFromBuffer(bytes.data(), size, &header);
  int capacity = 1024;
  auto* buffer = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(1024));
  const int answer = buffer != nullptr && small(header)
                         ? TAVIRPELO_ReEncodeJpegToBuffer(bytes.data(), size, 1, &buffer, &capacity,
                                                          400 + 100 * r.lines)
                         : 0;
  TAVIRPELO_OsFree(buffer);
  return answer;
}

int exif(TAVIRPELO_DECINFO* d, uint8_t*, const Request&) {
  const auto bytes = memory_of(*d);
  TAVIRPELO_EXIFINFO* info =
      TAVIRPELO_CreateJpegExifInfoFromBuffer(bytes.data(), static_cast<int>(bytes.size()));
  size_t read = 0;  // a sum of what the record points to, so that all of it is read
  if (info != nullptr) {
    for (const char* text : {info->make, info->model, info->software, info->rights, info->captureTime})
      read += text == nullptr ? 0 : std::string_view(text).size();
    for (uint32_t i = 0; info->gps != nullptr && i < info->gps->processingMethodLength; ++i)
      read += info->gps->processingMethod[i];
    if (info->exifVersion != nullptr) read += info->exifVersion[3];
    TAVIRPELO_DestroyJpegExifInfo(info);
  }
  return info != nullptr && read < bytes.size() * 256;
}

int zoomed(TAVIRPELO_DECINFO* d, uint8_t* pixels, const Request& r) {
  if (r.format > TAVIRPELO_RGB888) return 0;
  const int answer =
      TAVIRPELO_StartZoom(d, nullptr, 0, 0, pixels, r.width, r.height, 0x1234, 1 << 20, 1, -1);
  if (answer <= 0) return 0;
  for (int code = TAVIRPELO_ZOOM_IN; code <= TAVIRPELO_ZOOM_REFRESH; ++code)
    TAVIRPELO_ControlZoom(d, pixels, r.width, r.height, code);
  TAVIRPELO_StopZoom(d);
  return 1;
}

constexpr Entry kEntries[] = {
    {"parse", "", parse, false},
    {"one_call", "", one_call, false},
    {"jpeg", "jpeg", whole<TAVIRPELO_DecodeJPEG>, true},
    {"jpeg_in_bands", "jpeg", in_bands, true},
    {"jpeg_turned", "jpeg", turned, false},
    {"jpeg_fitted", "jpeg", fitted, false},
    {"jpeg_exif", "jpeg", exif, false},
    {"jpeg_zoomed", "jpeg", zoomed, false},
    {"png", "png", whole<TAVIRPELOI_DecodePNG>, true},
    {"png_by_lines", "png", by_lines<TAVIRPELOI_DecodePNGLine>, true},
    {"png_by_blocks", "png", repeated<TAVIRPELOI_DecodePNGIter>, true},
    {"gif", "gif", whole<TAVIRPELOI_DecodeGIF>, true},
    {"gif_by_lines", "gif", by_lines<TAVIRPELOI_DecodeGIFLine>, true},
    {"gif_in_batches", "gif", repeated<TAVIRPELOI_DecodeGIFIter>, true},
    {"gif_frames", "gif", repeated<TAVIRPELOI_DecodeAGIF, true>, false},
    {"gif_frames_in_batches", "gif", repeated<TAVIRPELOI_DecodeAGIFIter, true>, false},
    {"bmp", "bmp", whole<TAVIRPELOI_DecodeBMP>, true},
    {"bmp_by_lines", "bmp", by_lines_in_place<TAVIRPELOI_DecodeBMPLine>, true},
    {"bmp_in_batches", "bmp", repeated<TAVIRPELOI_DecodeBMPIter>, true},
    {"wbmp", "wbmp", whole<TAVIRPELOI_DecodeWBMP>, true},
};

}  // namespace

std::span<const Entry> entries() {
  return kEntries;
}

const Entry& entry(std::string_view name) {
  return *std::find_if(std::begin(kEntries), std::end(kEntries),
                       [&](const Entry& e) { return name == e.name; });
}

void repair_checksums(std::span<uint8_t> file) {
  if (file.size() < 8 || file[1] != 'P') return;
  for (size_t at = 8; at + 12 <= file.size();) {
    const size_t length = pelo::load_be32(&file[at]);
    if (length == 0 || length > file.size() - at - 12) return;
    pelo::store_be32(&file[at + 8 + length],
                     __PELOI_PngCrc32(&file[at + 4], static_cast<uint32_t>(length) + 4));
    at += 12 + length;
  }
}

}  // namespace tests
