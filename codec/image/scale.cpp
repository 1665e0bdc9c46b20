// The scaling family on RGB565 and RGB888 pictures.
#include "codec/image/scale.h"

#include <cstring>

namespace pelo {
namespace {

bool usable(const Scaling& s) {
  return s.source.first != nullptr && s.target.first != nullptr && s.source.width > 0 &&
         s.source.height > 0 && s.target.width > 0 && s.target.height > 0;
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
  resample_average<Pixel>(s.source, s.target, quarter_phases(s.source.width),
                          quarter_phases(s.source.height), finish);
}

// Enlarging of RGB565 places its second sample at three times the truncated quarter.
constexpr Phases enlarging_phases(int inputs) {
  return {inputs / 4, 3 * (inputs / 4)};
}

}  // namespace

void write_averages565(const uint32_t* words, uint8_t* out, int count) {
  for (int i = 0; i < count; ++i) {
    const uint32_t sum = words[i];
    store_le16(out + 2 * i, (sum & 0x3E000000) >> 14 | (sum & 0xFC000) >> 9 | (sum >> 5 & 0x1F));
  }
}

// A pixel goes out as four bytes, the fourth of which the next pixel overwrites; the last one as three.
void write_averages888(const uint32_t* words, uint8_t* out, int count) {
  for (int i = 0; i + 1 < count; ++i, out += 3) {
    const uint32_t sum = words[i];
    store_le32(out, (sum >> 22 & 0xFF) | (sum >> 4 & 0xFF00) | (sum << 14 & 0xFF0000));
  }
  if (count < 1) return;
  for (int channel = 0; channel < 3; ++channel) out[channel] = lane_average(words[count - 1], channel);
}

void scale565(const Scaling& s) {
  grows(s) ? enlarge565(s) : reduce565(s);
}

void enlarge565(const Scaling& s) {
  if (!usable(s)) return;
  resample_average<Word565>(s.source, s.target, enlarging_phases(s.source.width),
                            enlarging_phases(s.source.height), write_averages565);
}

void reduce565(const Scaling& s) {
  average<Word565>(s, write_averages565);
}

void scale888(const Scaling& s) {
  average<Word888>(s, write_averages888);
}

void pick565(const Scaling& s) {
  if (!usable(s) || copy_equal(s, 2)) return;
  resample_nearest(s.source, s.target, 2,
                   [](const uint8_t* in, uint8_t* out) { std::memcpy(out, in, 2); });
}

}  // namespace pelo
