// Scaling into a part of a picture: a virtual scaled picture is anchored in the destination and cropped
// by it.
#include <algorithm>
#include <cstring>

#include "codec/base/errors.h"
#include "codec/image/image.h"
#include "codec/image/resample.h"
#include "codec/image/scale.h"

namespace pelo {
namespace {

enum Anchor { kCentre = 0, kLeftTop = 1, kRightTop = 2, kLeftBottom = 3, kRightBottom = 4 };
enum class Edge { kMiddle, kLow, kHigh };

Edge across(int anchor) {
  if (anchor == kCentre) return Edge::kMiddle;
  return anchor == kLeftTop || anchor == kLeftBottom ? Edge::kLow : Edge::kHigh;
}
Edge down(int anchor) {
  if (anchor == kCentre) return Edge::kMiddle;
  return anchor == kLeftTop || anchor == kRightTop ? Edge::kLow : Edge::kHigh;
}

// Which samples of the source cover which of the destination, along one axis.
struct Span {
  int sourceStart, sourceCount;
  int targetStart, targetCount;
};

Span span_of(int64_t source, int64_t target, int64_t scaled, Edge edge) {
  const int64_t rest = scaled < target ? target - scaled : scaled - target;
  const int64_t shift = edge == Edge::kLow ? 0 : edge == Edge::kMiddle ? rest >> 1 : rest;
  if (target >= scaled) {
    return {0, static_cast<int>(source), static_cast<int>(shift), static_cast<int>(scaled)};
  }
  // A span of no sample would leave nothing to show.
  const int64_t count = std::max<int64_t>(1, source * target / scaled);
  const int64_t start = std::min(source * shift / scaled, source - count);
  return {static_cast<int>(start), static_cast<int>(count), 0, static_cast<int>(target)};
}

// Adds a quarter of each sample into the destination's bytes, which hold zeros to begin with.
template <size_t Bytes>
struct QuarterSamples {
  static constexpr ptrdiff_t kBytes = Bytes;
  static uint32_t word(const uint8_t* pixel) {
    uint32_t word = 0;
    for (size_t c = 0; c < Bytes; ++c) word |= (uint32_t{pixel[c]} >> 2) << 8 * c;
    return word;
  }
  static void add(const uint32_t* words, uint8_t* out, int count) {
    for (int i = 0; i < count; ++i, out += Bytes) {
      for (size_t c = 0; c < Bytes; ++c) out[c] = static_cast<uint8_t>(out[c] + (words[i] >> 8 * c));
    }
  }
};

template <size_t Bytes>
void add_average(const SourceArea& source, const TargetArea& target) {
  resample_average<QuarterSamples<Bytes>>(source, target, quarter_phases(source.width),
                                          quarter_phases(source.height), QuarterSamples<Bytes>::add);
}

template <size_t Bytes>
void pick_nearest(const SourceArea& source, const TargetArea& target) {
  resample_nearest(source, target, ptrdiff_t{Bytes},
                   [](const uint8_t* in, uint8_t* out) { std::memcpy(out, in, Bytes); });
}

void average565(const SourceArea& source, const TargetArea& target) {
  resample_average<Word565>(source, target, quarter_phases(source.width), quarter_phases(source.height),
                            write_averages565);
}

using Kernel = void (*)(const SourceArea&, const TargetArea&);
struct Format {
  int code;
  int bytes;
  Kernel byQuality[2];
};
constexpr Format kFormats[] = {{TAVIRPELO_RGB565, 2, {pick_nearest<2>, average565}},
                               {TAVIRPELO_RGB888, 3, {pick_nearest<3>, add_average<3>}},
                               {TAVIRPELO_ARGB8888, 4, {pick_nearest<4>, add_average<4>}}};

const Format* find_format(int code) {
  for (const Format& format : kFormats) {
    if (format.code == code) return &format;
  }
  return nullptr;
}

int refuse_with(int code) {
  record_error(ErrorWord::kCodec, code);
  return 0;
}

}  // namespace

int scale_anchored(const ScaleRequest& request) {
  const auto& [src, dst, srcWidth, srcHeight, srcStride, dstWidth, dstHeight, dstStride, scaledWidth,
               scaledHeight, format, anchor, quality] = request;
  if (src == nullptr || dst == nullptr) return refuse_with(TAVIRPELO_CODEC_ARGUMENT);
  for (const int size : {srcWidth, srcHeight, srcStride, dstWidth, dstHeight, dstStride}) {
    if (size < 1) return refuse_with(TAVIRPELO_CODEC_ARGUMENT);
  }
  const Format* layout = find_format(format);
  if (quality < 0 || quality > 1 || anchor < kCentre || anchor > kRightBottom || layout == nullptr) {
    return refuse_with(TAVIRPELO_CODEC_FORMAT);
  }
  if (scaledWidth < 1 || scaledHeight < 1) return 0;

  const ptrdiff_t bytes = layout->bytes;
  const bool anyStride = format == TAVIRPELO_RGB888;
  const auto whole_pixels = [=](int stride) {
    return anyStride ? ptrdiff_t{stride} : stride / bytes * bytes;
  };
  const ptrdiff_t sourceStride = whole_pixels(srcStride), targetStride = whole_pixels(dstStride);
  const Span x = span_of(srcWidth, dstWidth, scaledWidth, across(anchor));
  const Span y = span_of(srcHeight, dstHeight, scaledHeight, down(anchor));
  const SourceArea source{
      static_cast<const uint8_t*>(src) + y.sourceStart * sourceStride + x.sourceStart * bytes,
      x.sourceCount, y.sourceCount, sourceStride};
  const TargetArea target{
      static_cast<uint8_t*>(dst) + y.targetStart * targetStride + x.targetStart * bytes, x.targetCount,
      y.targetCount, targetStride};
  layout->byQuality[quality](source, target);
  return 1;
}

}  // namespace pelo
