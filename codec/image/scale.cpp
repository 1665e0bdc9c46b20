// The scaling family on RGB565 and RGB888 pictures.
#include "codec/image/scale.h"

#include <cstring>

#include "codec/image/resample.h"
#include "tavirpelo/raw.h"

using namespace pelo;

namespace {

// The arguments of a scaler, with strides in pixels.
struct Scaling {
  SourceArea source;
  TargetArea target;
};

bool usable(const Scaling& s) {
  return s.source.first != nullptr && s.target.first != nullptr && s.source.width > 0 &&
         s.source.height > 0 && s.target.width > 0 && s.target.height > 0;
}

Scaling scaling(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst, int dstWidth,
                int dstHeight, int dstStride, ptrdiff_t bytes) {
  return {{static_cast<const uint8_t*>(src), srcWidth, srcHeight, srcStride * bytes},
          {static_cast<uint8_t*>(dst), dstWidth, dstHeight, dstStride * bytes}};
}

bool grows(const Scaling& s) {
  return s.target.width > s.source.width || s.target.height > s.source.height;
}

// Pictures of one size are copied; the sampling formulas say the same.
bool copy_equal(const Scaling& s, ptrdiff_t bytes) {
  if (s.source.width != s.target.width || s.source.height != s.target.height) return false;
  for (int y = 0; y < s.source.height; ++y) {
    std::memcpy(s.target.first + y * s.target.stride, s.source.first + y * s.source.stride,
                static_cast<size_t>(s.source.width * bytes));
  }
  return true;
}

template <class Pixel, class Finish>
void average(const Scaling& s, Finish finish) {
  if (!usable(s) || copy_equal(s, Pixel::kBytes)) return;
  resample_average<Pixel>(s.source, s.target, average_phases(s.source.width),
                          average_phases(s.source.height), finish);
}

void nearest565(const Scaling& s) {
  if (!usable(s) || copy_equal(s, 2)) return;
  resample_nearest(s.source, s.target, 2,
                   [](const uint8_t* in, uint8_t* out) { std::memcpy(out, in, 2); });
}

// Enlarging of RGB565 places its second sample at three times the truncated quarter.
constexpr Phases enlarging_phases(int inputs) {
  return {inputs / 4, 3 * (inputs / 4)};
}

}  // namespace

void PELO_WriteOutputBuf(const uint32_t* words, void* output, int count) {
  auto* out = static_cast<uint8_t*>(output);
  for (int i = 0; i < count; ++i) {
    const uint32_t sum = words[i];
    store_le16(out + 2 * i, (sum & 0x3E000000) >> 14 | (sum & 0xFC000) >> 9 | (sum >> 5 & 0x1F));
  }
}

// A pixel goes out as four bytes, the fourth of which the next pixel overwrites; the last one as three.
void PELO_WriteRGB888OutputBuf(const uint32_t* words, void* output, int count) {
  auto* out = static_cast<uint8_t*>(output);
  for (int i = 0; i + 1 < count; ++i, out += 3) {
    const uint32_t sum = words[i];
    store_le32(out, (sum >> 22 & 0xFF) | (sum >> 4 & 0xFF00) | (sum << 14 & 0xFF0000));
  }
  if (count < 1) return;
  for (int channel = 0; channel < 3; ++channel) out[channel] = lane_average(words[count - 1], channel);
}

// Every member takes (src, srcWidth, srcHeight, srcStride, dst, dstWidth, dstHeight, dstStride).
#define PELO_SCALER(Name, bytes, body)                                                            \
  void Name(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst, int dstWidth, \
            int dstHeight, int dstStride) {                                                       \
    const Scaling s =                                                                             \
        scaling(src, srcWidth, srcHeight, srcStride, dst, dstWidth, dstHeight, dstStride, bytes); \
    body;                                                                                         \
  }
#define PELO_CHOOSE(Up, Down) \
  (grows(s) ? Up : Down)(src, srcWidth, srcHeight, srcStride, dst, dstWidth, dstHeight, dstStride)

PELO_SCALER(PELO_DownScale, 2, average<Word565>(s, PELO_WriteOutputBuf))
PELO_SCALER(PELO_UpScale, 2,
            if (usable(s)) resample_average<Word565>(s.source, s.target, enlarging_phases(srcWidth),
                                                     enlarging_phases(srcHeight), PELO_WriteOutputBuf))
PELO_SCALER(PELO_RGB888DownScale, 3, average<Word888>(s, PELO_WriteRGB888OutputBuf))
PELO_SCALER(PELO_RGB888UpScale, 3, average<Word888>(s, PELO_WriteRGB888OutputBuf))
PELO_SCALER(PELO_DownScale_1sample, 2, nearest565(s))
PELO_SCALER(PELO_UpScale_1sample, 2, nearest565(s))
PELO_SCALER(PELO_Scale_ex, 2, PELO_CHOOSE(PELO_UpScale, PELO_DownScale))
PELO_SCALER(PELO_FastScale_ex, 2, PELO_CHOOSE(PELO_UpScale_1sample, PELO_DownScale_1sample))
PELO_SCALER(PELO_RGB888Scale_ex, 3, PELO_CHOOSE(PELO_RGB888UpScale, PELO_RGB888DownScale))
#undef PELO_CHOOSE
#undef PELO_SCALER
