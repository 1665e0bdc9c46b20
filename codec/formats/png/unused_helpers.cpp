#include "codec/formats/png/unused_helpers.h"

#include "codec/base/os_memory.h"
#include "codec/pixel/blend.h"

using namespace pelo;

namespace {

// The four samples of each output column.
template <size_t Channels, class Write>
void resize_row(const uint8_t* upper, const uint8_t* lower, uint32_t sourceWidth, uint32_t outWidth,
                uint8_t* output, Write write) {
  if (sourceWidth == 0 || outWidth == 0) return;
  AxisStepper quarter(sourceWidth, outWidth, sourceWidth / 4);
  AxisStepper threeQuarters(sourceWidth, outWidth, int64_t{3} * sourceWidth / 4);
  for (uint32_t k = 0; k < outWidth; ++k, quarter.advance(), threeQuarters.advance()) {
    const size_t a = static_cast<size_t>(quarter.position()) * Channels;
    const size_t b = static_cast<size_t>(threeQuarters.position()) * Channels;
    const uint8_t* const samples[4] = {upper + a, upper + b, lower + a, lower + b};
    write(samples, output + k * Channels);
  }
}

template <size_t Channels>
void write_average(const uint8_t* const (&samples)[4], uint8_t* out) {
  for (size_t c = 0; c < Channels; ++c) {
    uint32_t sum = 0;
    for (const uint8_t* sample : samples) sum += uint32_t{sample[c]} >> 2;
    out[c] = static_cast<uint8_t>(sum);
  }
}

}  // namespace

void __PELOI_PngFreeTextList(PELOI_PNGTEXT* head) {
  while (head != nullptr) {
    PELOI_PNGTEXT* const next = head->next;
    TAVIRPELO_OsFree(head->text);
    TAVIRPELO_OsFree(head);
    head = next;
  }
}

PELOI_PNGTRINFO* PELOI_FastImgCreatePngTrInfo(void) {
  return os_new<PELOI_PNGTRINFO>().release();
}

void PELOI_FastImgDestroyPngTrInfo(PELOI_PNGTRINFO* info) {
  if (info == nullptr) return;
  if (info->ownsBlock != 0) TAVIRPELO_OsFree(info->block);
  TAVIRPELO_OsFree(info);
}

uint32_t __PELOI_PngReadBits(const uint8_t* bytes, uint32_t bytePosition, uint32_t bitPosition,
                             uint32_t count) {
  uint32_t value = 0;
  for (uint32_t i = 0; i < count && i < 32; ++i) {
    const uint64_t bit = uint64_t{bitPosition} + i;
    value |= (uint32_t{bytes[bytePosition + bit / 8]} >> (bit % 8) & 1) << i;
  }
  return value;
}

int __PELOI_NearestInterpolateOutput(PELOI_PNGCONTEXT*, void*, uint32_t, uint32_t) {
  return 1;
}

void __PELOI_PngResize_32bit(const PELOI_PNGCONTEXT*, const uint8_t* upper, const uint8_t* lower,
                             uint32_t sourceWidth, uint32_t outWidth, uint8_t* output) {
  resize_row<4>(upper, lower, sourceWidth, outWidth, output, write_average<4>);
}

void __PELOI_PngResize_24bit(const PELOI_PNGCONTEXT*, const uint8_t* upper, const uint8_t* lower,
                             uint32_t sourceWidth, uint32_t outWidth, uint8_t* output) {
  resize_row<3>(upper, lower, sourceWidth, outWidth, output, write_average<3>);
}

void __PELOI_PngResize_24bit_TR(const PELOI_PNGCONTEXT* context, const uint8_t* upper,
                                const uint8_t* lower, uint32_t sourceWidth, uint32_t outWidth,
                                uint8_t* output) {
  const auto& key = context->info.colourKey;
  const auto write = [&key](const uint8_t* const(&samples)[4], uint8_t* out) {
    const uint8_t* kept[4];
    size_t count = 0;
    for (const uint8_t* s : samples) {
      if (s[0] != key[0] || s[1] != key[1] || s[2] != key[2]) kept[count++] = s;
    }
    if (count == 0) return;
    const uint8_t* const filled[4] = {kept[0], kept[1 % count], kept[2 % count], kept[3 % count]};
    write_average<3>(filled, out);
  };
  resize_row<3>(upper, lower, sourceWidth, outWidth, output, write);
}

uint8_t APPLY_ALPHA_BYTE_TO_BYTE(uint32_t foreground, uint32_t alpha, uint32_t background) {
  return blend_channel(foreground & 255, alpha & 255, background & 255);
}

uint16_t APPLY_ALPHA_RGB_TO_SHORT(uint32_t red, uint32_t green, uint32_t blue, uint32_t alpha,
                                  uint32_t background565) {
  return blend_rgb565(red & 255, green & 255, blue & 255, alpha & 255, background565);
}
