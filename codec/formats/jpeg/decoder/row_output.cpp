#include "codec/formats/jpeg/decoder/row_output.h"

#include <algorithm>
#include <cstring>

#include "codec/base/geometry.h"
#include "codec/formats/jpeg/decoder/jd_info.h"
#include "codec/pixel/quad_sampler.h"
#include "codec/pixel/ycc.h"

namespace pelo::jpeg {
namespace {

// Rows go through the first-level cache in runs of this many pixels. Even, so that chroma pairs do not
// straddle runs, and a multiple of the dither's period.
constexpr int kRun = 256;

// One run of three channels; pointers so that rows that need no preparation are not copied.
struct Run {
  const uint8_t* channel[3];
};
struct RunBuffer {
  uint8_t channel[3][kRun];
  Run view() const { return {{channel[0], channel[1], channel[2]}}; }
};

// 4 x 4 ordered dither.
constexpr uint8_t kDither[4][4] = {{10, 2, 8, 0}, {6, 14, 4, 12}, {9, 1, 11, 3}, {5, 13, 7, 15}};

// Row sources: what a writer is given, as runs of samples.
struct RowSource {  // one sample a pixel
  const uint8_t* channel[3];
  Run run(int begin, int, RunBuffer&) const {
    return {{channel[0] + begin, channel[1] + begin, channel[2] + begin}};
  }
};
struct ColumnSource {  // samples picked by a column table
  const uint8_t* channel[3];
  const uint16_t* columns;
  Run run(int begin, int count, RunBuffer& buffer) const {
    for (int c = 0; c < 3; ++c) {
      for (int i = 0; i < count; ++i) buffer.channel[c][i] = channel[c][columns[begin + i]];
    }
    return buffer.view();
  }
};
struct SumSource {  // averages of packed sums
  const uint32_t* sums;
  Run run(int begin, int count, RunBuffer& buffer) const {
    for (int c = 0; c < 3; ++c) {
      for (int i = 0; i < count; ++i) buffer.channel[c][i] = lane_average(sums[begin + i], c);
    }
    return buffer.view();
  }
};

// Colour models: what the three channels are.
struct YccModel {
  static constexpr bool kPlanar = true;
  static constexpr bool kGrey = false;
  static Run rgb(const Run& in, int count, const RowOutput& output, RunBuffer& buffer) {
    if (output.dither) {
      const uint8_t* matrix = kDither[output.emitted & 3];
      convert(in, count, buffer, [matrix](int i) { return int{matrix[i & 3]}; });
    } else {
      convert(in, count, buffer, [](int) { return 0; });
    }
    return buffer.view();
  }

 private:
  // `dither` tells what is added to pixel i; half of it to green.
  template <class Dither>
  static void convert(const Run& in, int count, RunBuffer& buffer, Dither dither) {
    uint8_t* __restrict r = buffer.channel[0];
    uint8_t* __restrict g = buffer.channel[1];
    uint8_t* __restrict b = buffer.channel[2];
    for (int i = 0; i < count; ++i) {
      const int y = in.channel[0][i];
      const ChromaOffsets offsets = chroma_offsets(in.channel[1][i], in.channel[2][i]);
      const int d = dither(i);
      r[i] = clamp_channel(y + d + offsets.r);
      g[i] = clamp_channel(y + (d >> 1) + offsets.g);
      b[i] = clamp_channel(y + d + offsets.b);
    }
  }
};
struct GreyModel {
  static constexpr bool kPlanar = true;
  static constexpr bool kGrey = true;
  static Run rgb(const Run& in, int, const RowOutput&, RunBuffer&) {
    return {{in.channel[0], in.channel[0], in.channel[0]}};
  }
};
struct RgbModel {
  static constexpr bool kPlanar = false;
  static constexpr bool kGrey = false;
  static Run rgb(const Run& in, int, const RowOutput&, RunBuffer&) { return in; }
};

// Planar rows: luma whole; on even rows one chroma sample for each pair of pixels, the even column's.
template <class Model>
void store_planar(const RowOutput& output, const Run& in, int begin, int count) {
  const ptrdiff_t row = output.emitted - output.firstRow;
  std::memcpy(output.plane[0] + row * output.rowStep + begin, in.channel[0], static_cast<size_t>(count));
  if (output.emitted % 2 != 0) return;
  const ptrdiff_t chromaRow = output.emitted / 2 - (output.firstRow + 1) / 2;
  for (int c = 1; c < 3; ++c) {
    uint8_t* out = output.plane[c] + chromaRow * ((output.rowStep + 1) >> 1) + begin / 2;
    for (int i = 0; i < count; i += 2) out[i / 2] = Model::kGrey ? 128 : in.channel[c][i];
  }
}

// Delivers one row: the only place that counts and bounds output rows.
template <class Model, class Source>
void emit_row(RowOutput& output, const Source& source, int count) {
  const bool writes = output.plane[0] != nullptr && (!output.planar || Model::kPlanar);
  if (output.emitted >= output.bandEnd) return;
  RunBuffer samples, colours;
  for (int begin = 0; writes && begin < count; begin += kRun) {
    const int length = std::min(kRun, count - begin);
    const Run in = source.run(begin, length, samples);
    if (output.planar) {
      store_planar<Model>(output, in, begin, length);
      continue;
    }
    const Run rgb = Model::rgb(in, length, output, colours);
    uint8_t* out =
        output.plane[0] + (output.emitted - output.firstRow) * output.rowStep + begin * output.pixelStep;
    output.pack(rgb.channel[0], rgb.channel[1], rgb.channel[2], length, out, output.pixelStep);
  }
  ++output.emitted;
}

// Planes of a 4:2:0 buffer. Rotation does not apply to it.
void set_planes(RowOutput& output, uint8_t* buffer, const Placement& p, int64_t height) {
  const int64_t chromaPitch = (p.pitch() + 1) >> 1;
  const int64_t chroma = chromaPitch * (p.top >> 1) + (p.left >> 1);
  output.planar = 1;
  output.rowStep = static_cast<ptrdiff_t>(p.pitch());
  output.plane[0] = buffer + p.first();
  output.plane[1] = buffer + p.pitch() * height + chroma;
  output.plane[2] = buffer + p.pitch() * height + chromaPitch * ((height + 1) >> 1) + chroma;
}

// Chooses the packer of a pixel format; its bytes a pixel, 0 for an unknown code: rows are then counted
// only.
int choose_packer(RowOutput& output, int outFormat, ColourSpace colourSpace) {
  output.dither = outFormat == TAVIRPELO_RGB565_DITHER && colourSpace == ColourSpace::kYcc ? 1 : 0;
  const int format = outFormat == TAVIRPELO_RGB565_DITHER ? TAVIRPELO_RGB565 : outFormat;
  output.pack = output.dither ? dithered_packer() : opaque_packer(format);
  return output.pack == nullptr ? 0 : bytes_per_pixel(format);
}

}  // namespace

void set_output(PELOJ_JDINFO& jd, void* buffer, uint32_t option) {
  const Size target{jd.sizes.target.width, jd.sizes.target.height};
  const uint32_t placing = (option & ~uint32_t{TAVIRPELO_ROTATE_MASK}) | jd.rotation;
  const Placement p = place({jd.sizes.buffer.width, jd.sizes.buffer.height}, target, placing);
  const bool tight = (option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_TIGHT;
  auto* bytes = static_cast<uint8_t*>(buffer);

  jd.output = {};
  jd.output.limit = jd.output.bandEnd = jd.sizes.target.height;
  if (buffer == nullptr) return;
  if (jd.outFormat == TAVIRPELO_YUV420) {
    set_planes(jd.output, bytes, p, tight ? target.height : jd.sizes.buffer.height);
    return;
  }
  const int size = choose_packer(jd.output, jd.outFormat, jd.frame.colourSpace);
  if (size == 0) return;
  jd.output.plane[0] = bytes + p.first() * size;
  jd.output.pixelStep = static_cast<ptrdiff_t>(p.pixel_step() * size);
  jd.output.rowStep = static_cast<ptrdiff_t>(p.row_step() * size);
}

void set_band(PELOJ_JDINFO& jd, uint8_t* const* planes, int rows) {
  RowOutput& output = jd.output;
  output.firstRow = output.emitted;
  output.bandEnd = output.emitted + std::min(rows, output.limit - output.emitted);
  output.planar = jd.outFormat == TAVIRPELO_YUV420;
  const int size = output.planar ? 1 : choose_packer(jd.output, jd.outFormat, jd.frame.colourSpace);
  const int used = output.planar ? 3 : 1;
  bool complete = planes != nullptr && size != 0;
  for (int c = 0; complete && c < used; ++c) {
    output.plane[c] = planes[c];
    complete = planes[c] != nullptr;
  }
  if (!complete) output.plane[0] = nullptr;
  output.pixelStep = size;
  output.rowStep = static_cast<ptrdiff_t>(int64_t{jd.sizes.buffer.width} * size);
}

void write_ycc_row(RowOutput& output, const uint8_t* y, const uint8_t* cb, const uint8_t* cr,
                   int count) {
  emit_row<YccModel>(output, RowSource{{y, cb, cr}}, count);
}
void write_grey_row(RowOutput& output, const uint8_t* y, int count) {
  emit_row<GreyModel>(output, RowSource{{y, y, y}}, count);
}
void write_rgb_row(RowOutput& output, const uint8_t* r, const uint8_t* g, const uint8_t* b, int count) {
  emit_row<RgbModel>(output, RowSource{{r, g, b}}, count);
}
void write_picked_row(RowOutput& output, const uint16_t* columns, const uint8_t* y, const uint8_t* cb,
                      const uint8_t* cr, int count) {
  emit_row<YccModel>(output, ColumnSource{{y, cb, cr}, columns}, count);
}
void write_ycc_sums(RowOutput& output, const uint32_t* sums, int count) {
  emit_row<YccModel>(output, SumSource{sums}, count);
}
void write_grey_sums(RowOutput& output, const uint32_t* sums, int count) {
  emit_row<GreyModel>(output, SumSource{sums}, count);
}
void write_rgb_sums(RowOutput& output, const uint32_t* sums, int count) {
  emit_row<RgbModel>(output, SumSource{sums}, count);
}

}  // namespace pelo::jpeg
