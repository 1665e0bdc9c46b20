// The row decoders and row writers of the six bit counts: one template over how a pixel is read.
//
// Resized pictures average four pixels: those at the quarter and three-quarter points of an output
// pixel's span, in the rows at these points of its row. Points are counted from the last image row up,
// as rows stand in an ordinary file, so that a top-down file gives the same picture.
#include <algorithm>
#include <iterator>

#include "codec/base/byte_order.h"
#include "codec/base/dec_info.h"
#include "codec/formats/bmp/bmp_record.h"
#include "codec/pixel/packed_samples.h"
#include "codec/pixel/pixel_layout.h"
#include "codec/pixel/quad_sampler.h"

namespace pelo::bmp {
namespace {

// Pixel sources: pixel x of a file row as four bytes.
template <int Bits>
struct PaletteSource {
  static void pixel(const PELOI_BMPCOLOURS& colours, const uint8_t* row, size_t x, uint8_t* rgba) {
    std::copy_n(colours.palette[packed_sample<Bits>(row, x)].data(), 4, rgba);
  }
};
struct FieldSource {
  static void pixel(const PELOI_BMPCOLOURS& colours, const uint8_t* row, size_t x, uint8_t* rgba) {
    const uint32_t word = load_le16(row + 2 * x);
    const auto field = [word](const PELOI_BMPCOLOURS::Field& f) { return (word & f.mask) << f.shift; };
    rgba[0] = static_cast<uint8_t>(field(colours.red) >> 8 & 0xF8);
    rgba[1] = static_cast<uint8_t>(field(colours.green) >> 3 & 0xFC);
    rgba[2] = static_cast<uint8_t>(field(colours.blue) << 3 & 0xF8);
    rgba[3] = 255;
  }
};
template <size_t Bytes>
struct ByteSource {
  static void pixel(const PELOI_BMPCOLOURS&, const uint8_t* row, size_t x, uint8_t* rgba) {
    const uint8_t* bgr = row + Bytes * x;
    rgba[0] = bgr[2];
    rgba[1] = bgr[1];
    rgba[2] = bgr[0];
    rgba[3] = Bytes == 4 ? bgr[3] : 255;
  }
};

// Neighbouring pixels get a loop of their own: its constant stride is what vectorises.
template <class Layout, class Pixel>
void store_pixels(uint8_t* output, int count, ptrdiff_t pixelStep, Pixel pixel) {
  const auto store = [&](int x, uint8_t* out) {
    uint8_t rgba[4];
    pixel(static_cast<size_t>(x), rgba);
    Layout::store(out, rgba[0], rgba[1], rgba[2], rgba[3]);
  };
  if (pixelStep == Layout::kBytes) {
    for (int x = 0; x < count; ++x) store(x, output + x * Layout::kBytes);
  } else {
    for (int x = 0; x < count; ++x) store(x, output + x * pixelStep);
  }
}

template <class Source>
void write_row(const uint8_t* row, uint8_t* output, int width, ptrdiff_t pixelStep, int format,
               const PELOI_BMPCOLOURS* colours) {
  visit_layout(format, [&](auto layout) {
    store_pixels<decltype(layout)>(output, width, pixelStep, [&](size_t x, uint8_t* rgba) {
      Source::pixel(*colours, row, x, rgba);
    });
  });
}

// Adds a quarter of each channel of the pixels that output pixels draw on, as far as they are among the
// row's pixels from `first` to before `end`, to the output pixels' words.
template <class Source>
void add_pixels(PELOI_BMPRECORD& record, const uint8_t* bytes, int64_t first, int64_t end) {
  const auto word = [&](uint32_t column) {
    uint8_t rgba[4];
    Source::pixel(record.colours, bytes, column - static_cast<size_t>(first), rgba);
    const uint32_t bgra =
        uint32_t{rgba[3]} << 24 | uint32_t{rgba[0]} << 16 | uint32_t{rgba[1]} << 8 | rgba[2];
    return bgra >> 2 & 0x3F3F3F3F;
  };
  const uint32_t* quarter = record.columns.data();
  const uint32_t* threeQuarters = quarter + record.outWidth;
  const ptrdiff_t outWidth = record.outWidth;
  const auto output_from = [&](const uint32_t* columns, int64_t column) -> ptrdiff_t {
    if (column <= columns[0]) return 0;
    if (column > columns[outWidth - 1]) return outWidth;  // most rows are one piece
    return std::lower_bound(columns, columns + outWidth, column) - columns;
  };
  uint32_t* words = record.accumulators.data();
  const ptrdiff_t both = output_from(quarter, first), bothEnd = output_from(threeQuarters, end);
  const ptrdiff_t quarterEnd = output_from(quarter, end);
  ptrdiff_t x = output_from(threeQuarters, first);
  for (; x < std::min(both, bothEnd); ++x) words[x] += word(threeQuarters[x]);
  for (x = both; x < bothEnd; ++x) words[x] += word(quarter[x]) + word(threeQuarters[x]);
  for (; x < quarterEnd; ++x) words[x] += word(quarter[x]);
}

template <bool KeepsAlpha>
void write_words(const uint32_t* words, uint8_t* output, int width, ptrdiff_t pixelStep, int format) {
  visit_layout(format, [&](auto layout) {
    store_pixels<decltype(layout)>(output, width, pixelStep, [words](size_t x, uint8_t* rgba) {
      rgba[0] = static_cast<uint8_t>(words[x] >> 16);
      rgba[1] = static_cast<uint8_t>(words[x] >> 8);
      rgba[2] = static_cast<uint8_t>(words[x]);
      rgba[3] = KeepsAlpha ? static_cast<uint8_t>(words[x] >> 24) : 255;
    });
  });
}

// Row `up` counted from the last image row.
int64_t row_from_below(const PELOI_BMPRECORD& record, int64_t up) {
  return record.topDown ? record.height - 1 - up : up;
}

// Output row `up`, counted from the last. False when the source lacks a row of it, which then keeps what
// the buffer held.
bool decode_row(PELOI_BMPRECORD& record, int64_t up, const Depth& depth) {
  const RowSpan span = record.grid.span(record.outHeight - 1 - up, 0, record.outWidth);
  if (record.oneToOne) {
    return record.reader.for_pieces(
        row_from_below(record, up), [&](const uint8_t* bytes, int64_t first, int64_t count) {
          const auto visible = static_cast<int>(std::min(count, span.count - first));
          depth.write(bytes, span.first + first * span.step, visible, span.step, record.request.format,
                      &record.colours);
        });
  }
  std::fill_n(record.accumulators.data(), record.outWidth, 0u);
  const auto [quarter, threeQuarters] = quarter_phases(record.height);
  const bool topDown = record.topDown;
  for (const int64_t phase :
       {topDown ? threeQuarters : quarter, topDown ? quarter : threeQuarters}) {  // in file order
    const int64_t row = row_from_below(record, (phase + up * record.height) / record.outHeight);
    const bool there =
        record.reader.for_pieces(row, [&](const uint8_t* bytes, int64_t first, int64_t count) {
          depth.add(record, bytes, first, first + count);
        });
    if (!there) return false;
  }
  depth.write_averages(record.accumulators.data(), span.first, span.count, span.step,
                       record.request.format);
  return true;
}

template <class Source>
constexpr Depth depth(int bits, bool keepsAlpha = false) {
  return {bits, write_row<Source>, add_pixels<Source>,
          keepsAlpha ? write_alpha_words : write_opaque_words};
}

constexpr Depth kDepths[] = {
    depth<PaletteSource<1>>(1), depth<PaletteSource<4>>(4), depth<PaletteSource<8>>(8),
    depth<FieldSource>(16),     depth<ByteSource<3>>(24),   depth<ByteSource<4>>(32, true),
};

}  // namespace

const Depth* depth_of(int bits) {
  const auto* found = std::find_if(std::begin(kDepths), std::end(kDepths),
                                   [bits](const Depth& candidate) { return candidate.bits == bits; });
  return found == std::end(kDepths) ? nullptr : found;
}

int decode_rows(PELOI_BMPRECORD& record, int rows, const Depth& depth) {
  constexpr int kShort = 5;
  const int count = std::min(rows, record.outHeight - record.rowsDone);
  const int done = record.rowsDone;
  const int64_t lowest = int64_t{record.outHeight} - done - count;
  record.rowsDone += count;
  if (record.outWidth == 0 || !writes(record.request.format)) return 1;
  bool complete = true;
  for (int i = 0; i < count; ++i) {
    if (!caller_agrees(record.decInfo, done + i)) return 0;
    complete &= decode_row(record, lowest + (record.topDown ? count - 1 - i : i), depth);
  }
  return complete || record.reader.at_end() ? 1 : kShort;
}

void write_opaque_words(const uint32_t* accumulatorRow, uint8_t* output, int outWidth,
                        ptrdiff_t pixelStep, int format) {
  write_words<false>(accumulatorRow, output, outWidth, pixelStep, format);
}
void write_alpha_words(const uint32_t* accumulatorRow, uint8_t* output, int outWidth,
                       ptrdiff_t pixelStep, int format) {
  write_words<true>(accumulatorRow, output, outWidth, pixelStep, format);
}

}  // namespace pelo::bmp
