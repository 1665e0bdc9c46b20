// The decoder of wireless bitmaps.
#include <algorithm>
#include <climits>
#include <cstdio>
#include <cstring>
#include <utility>

#include "codec/base/dec_info.h"
#include "codec/base/geometry.h"
#include "codec/base/io.h"
#include "codec/base/output_grid.h"
#include "codec/formats/bmp/bmp_record.h"
#include "codec/formats/format.h"
#include "codec/pixel/packed_samples.h"
#include "codec/pixel/pixel_layout.h"
#include "codec/pixel/quad_sampler.h"
#include "codec/pixel/row_stores.h"
#include "tavirpelo/decode.h"

namespace pelo::bmp {
namespace {

constexpr const char* kStage = "WBMP header";
constexpr int kHeadBytes = 20;  // enough for any header that is accepted
constexpr int kMaxGroups = 20;
constexpr int kMaxIntGroups = 4;  // 28 bits
constexpr uint16_t kWhite565 = 0xFFDF;
constexpr uint32_t kWhiteSample = 63 << 16 | 63 << 8 | 63;  // a quarter of white in R, G and B

struct Wbmp {
  uint32_t width, height;
  int dataOffset;
  int64_t rowBytes;
};

bool read_integer(const uint8_t* data, int size, int* position, uint32_t& value) {
  uint8_t packed[kMaxGroups];
  int groups = 0;
  collect_groups(data, size, position, &groups, packed);
  if (groups > kMaxIntGroups) return refuse(Reason::kDamaged, kStage, "size");
  value = number_of_groups(packed, groups, groups);
  return true;
}

bool parse(const uint8_t* data, int size, Wbmp& wbmp) {
  if (size < 2) return refuse(Reason::kTruncated, kStage);
  if (data[0] != 0 || (data[1] & 0x80) != 0) return refuse(Reason::kUnknownFormat, kStage);
  wbmp.dataOffset = 2;
  if (!read_integer(data, size, &wbmp.dataOffset, wbmp.width)) return false;
  if (!read_integer(data, size, &wbmp.dataOffset, wbmp.height)) return false;
  wbmp.rowBytes = (int64_t{wbmp.width} + 7) / 8;
  return true;
}

bool read_header(TAVIRPELO_IO* io, Wbmp& wbmp) {
  if (seek_io(io, 0, SEEK_SET) != 0) return refuse(Reason::kSource, kStage);
  if (io->size <= 3) return refuse(Reason::kTruncated, kStage);
  if (io->ioType == TAVIRPELO_IO_MEMORY) {
    return parse(static_cast<const uint8_t*>(io->pSource), io->size, wbmp);
  }
  if (io->ioType != TAVIRPELO_IO_FILE) return refuse(Reason::kSource, kStage);
  uint8_t head[kHeadBytes];
  return parse(head, read_io(io, head, kHeadBytes), wbmp);
}

// Black or white in an output format.
template <class Store>
void write_pixels(const uint8_t* bytes, const RowSpan& span, Store store) {
  for (int i = 0; i < span.count; ++i) {
    store(span.first + i * span.step, packed_sample<1>(bytes, static_cast<size_t>(i)) != 0);
  }
}

// A picture that fits is cut nowhere: pixels of a row and of its span are the same.
bool write_plain(TAVIRPELO_DECINFO* decInfo, RowReader& reader, const OutputGrid& grid, Size picture,
                 int format) {
  for (int y = 0; y < picture.height; ++y) {
    if (!caller_agrees(decInfo, y)) return false;
    const auto write = [&](const uint8_t* bytes, int64_t first, int64_t count) {
      const RowSpan span = grid.span(y, first, count);
      if (format == TAVIRPELO_RGB565) {
        write_pixels(bytes, span,
                     [](uint8_t* out, bool white) { store_le16(out, white ? kWhite565 : 0u); });
      } else {
        write_pixels(bytes, span,
                     [](uint8_t* out, bool white) { std::memset(out, white ? 255 : 0, 3); });
      }
    };
    if (!reader.for_pieces(y, write)) return refuse(Reason::kDamaged, "WBMP picture");
  }
  return true;
}

// Adds the two samples of each output pixel in a row.
bool add_row(RowReader& reader, int64_t row, const Wbmp& wbmp, OsBuffer<uint32_t>& words) {
  struct Point {
    AxisStepper at;
    size_t next;  // output pixel
  };
  const auto out = static_cast<int64_t>(words.size());
  // Steppers of their own: a piece may end between the two points of an output pixel.
  const auto [quarter, threeQuarters] = quarter_phases(wbmp.width);
  Point points[] = {{{wbmp.width, out, quarter}, 0}, {{wbmp.width, out, threeQuarters}, 0}};
  return reader.for_pieces(row, [&](const uint8_t* bytes, int64_t first, int64_t count) {
    for (auto& [at, next] : points) {
      for (; next < words.size() && at.position() < first + count; ++next, at.advance()) {
        const bool white = packed_sample<1>(bytes, static_cast<size_t>(at.position() - first)) != 0;
        words[next] += white ? kWhiteSample : 0u;
      }
    }
  });
}

void write_words(const OsBuffer<uint32_t>& words, const RowSpan& span, int format) {
  for (int i = 0; i < span.count; ++i) {
    const uint32_t word = words[static_cast<size_t>(span.skip + i)];
    const auto r = static_cast<uint8_t>(word >> 16), g = static_cast<uint8_t>(word >> 8);
    const auto b = static_cast<uint8_t>(word);
    uint8_t* out = span.first + i * span.step;
    if (format == TAVIRPELO_RGB565) {
      layout::Rgb565::store(out, r, g, b);
    } else {
      layout::Rgb888::store(out, r, g, b);
    }
  }
}

// Averages of four samples; the rows they stand in follow each other downwards.
bool write_resized(TAVIRPELO_DECINFO* decInfo, const Wbmp& wbmp, RowReader& reader,
                   const OutputGrid& grid, Size out, int format) {
  OsBuffer<uint32_t> words;
  if (!obtain_block(int64_t{out.width} * 4, "WBMP picture",
                    [&] { return words.allocate(static_cast<size_t>(out.width)); }))
    return false;
  QuarterPoints rows(wbmp.height, out.height);
  for (int y = 0; y < out.height; ++y, rows.advance()) {
    if (!caller_agrees(decInfo, y)) return false;
    std::fill_n(words.data(), words.size(), 0u);
    for (const int64_t source : {rows.first(), rows.second()}) {
      if (!add_row(reader, source, wbmp, words)) return refuse(Reason::kDamaged, "WBMP picture");
    }
    write_words(words, grid.span(y, 0, out.width), format);
  }
  return true;
}

}  // namespace
void collect_groups(const uint8_t* data, int size, int* position, int* groupCount, uint8_t* packed) {
  *groupCount = 0;
  std::memset(packed, 0, kMaxGroups);
  bool more = true;
  for (int bit = 0; more && *position < size && *groupCount < kMaxGroups; bit += 7, ++*groupCount) {
    const uint8_t byte = data[(*position)++];
    more = (byte & 0x80) != 0;
    for (int i = 0; i < 7; ++i) {
      const int at = bit + i;
      packed[at / 8] = static_cast<uint8_t>(packed[at / 8] | ((byte >> (6 - i) & 1) << (7 - at % 8)));
    }
  }
}

uint64_t power(uint64_t base, int exponent) {
  uint64_t power = 1;
  for (int i = 0; i < exponent; ++i) power *= base;
  return power;
}

uint32_t number_of_groups(const uint8_t* packed, int byteCount, int shift) {
  if (byteCount > 8 || shift > 63) return 0;
  uint64_t value = 0;
  for (int i = 0; i < byteCount; ++i) value = value << 8 | packed[i];
  return static_cast<uint32_t>(value / power(2, shift));
}

int decode_wbmp(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  if (!usable(decInfo, output, width, height, "WBMP decoder")) return 0;
  TAVIRPELO_IO* io = decInfo->pIO;
  Wbmp wbmp{};
  if (!read_header(io, wbmp)) return 0;
  if (int64_t{wbmp.height} * wbmp.rowBytes + wbmp.dataOffset > io->size)
    return refuse(Reason::kDamaged, "WBMP picture", "shorter than its size says");

  const bool stretch = decInfo->option == TAVIRPELO_FIT_STRETCH;
  const pelo::Size out =
      stretch ? pelo::Size{width, height} : pelo::fit_by_ratio(wbmp.width, wbmp.height, {width, height});
  decInfo->imageWidth = static_cast<int>(wbmp.width);
  decInfo->imageHeight = static_cast<int>(wbmp.height);
  decInfo->outWidth = out.width;
  decInfo->outHeight = out.height;
  if (out.width == 0 || out.height == 0 || wbmp.width == 0 || wbmp.height == 0) return 1;
  const int format = decInfo->outFormat;
  if (format != TAVIRPELO_RGB565 && format != TAVIRPELO_RGB888) return 1;

  RowReader reader;
  if (!reader.open(io, {wbmp.dataOffset, wbmp.rowBytes, wbmp.width, 1}, io->readSize)) return 0;
  const pelo::OutputGrid grid(output, {width, height}, (int64_t{width} - out.width + 1) / 2,
                              (int64_t{height} - out.height + 1) / 2, pelo::bytes_per_pixel(format));
  const bool plain =
      out.width == static_cast<int64_t>(wbmp.width) && out.height == static_cast<int64_t>(wbmp.height);
  return plain ? write_plain(decInfo, reader, grid, out, format)
               : write_resized(decInfo, wbmp, reader, grid, out, format);
}

// ---- format detection ----

namespace {

constexpr uint32_t kMaxWbmpSide = 5000;
constexpr uint32_t kWbmpSizeBytes =
    17;  // both sizes end within so many bytes of the two that open the file

enum class Multibyte { kRead, kTooLong, kCut };

// A multi-byte integer of at most `room` bytes: seven bits each, most significant first, bit 7 set on
// all but the last. Bits above the 32nd are lost.
Multibyte read_multibyte(Source& source, uint32_t& room, uint32_t& value) {
  value = 0;
  for (uint8_t byte = 0x80; byte & 0x80;) {
    if (room-- == 0) return Multibyte::kTooLong;
    if (!source.need(1)) return Multibyte::kCut;
    byte = *source.take(1);
    value = value << 7 | (byte & 0x7F);
  }
  return Multibyte::kRead;
}

}  // namespace

bool sniff_wbmp(const uint8_t* head) {
  return head[0] == 0 && head[1] < 0x80;
}

int parse_wbmp_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo) {
  if (hinfo != nullptr) hinfo->frameCount = 1;
  return parse_wbmp_sizes(decInfo, source);
}

int parse_wbmp_sizes(TAVIRPELO_DECINFO& decInfo, Source& source) {
  if (source.size <= 3) return TAVIRPELO_FORMAT_UNKNOWN;
  if (!source.need(2)) return cut_head("WBMP header");
  source.take(2);
  uint32_t room = kWbmpSizeBytes;
  uint32_t size[2];
  for (uint32_t& side : size) {
    const Multibyte result = read_multibyte(source, room, side);
    if (result == Multibyte::kCut) return cut_head("WBMP header");
    if (result == Multibyte::kTooLong) return TAVIRPELO_FORMAT_UNKNOWN;
  }
  found(decInfo, nullptr, TAVIRPELO_FORMAT_WBMP, size[0], size[1]);
  if (size[0] <= kMaxWbmpSide && size[1] <= kMaxWbmpSide) return TAVIRPELO_FORMAT_WBMP;
  return TAVIRPELO_FORMAT_UNKNOWN;
}

}  // namespace pelo::bmp
