// The given names of the image room; each forwards to the room's own function.
#include "codec/image/image_abi.h"

#include "codec/base/errors.h"
#include "codec/image/crop.h"
#include "codec/image/image.h"
#include "codec/image/scale.h"
#include "codec/pixel/pixel_layout.h"

using namespace pelo;

// ---- raw images ----

TAVIRPELO_RAWINFO* TAVIRPELO_CreateRawInfo(int width, int height, int format) {
  begin_operation();
  return create_raw_image(width, height, format);
}

void TAVIRPELO_DestroyRawInfo(TAVIRPELO_RAWINFO* raw) {
  destroy_raw_image(raw);
}

int TAVIRPELO_FillRawImageWithRgb565(TAVIRPELO_RAWINFO* raw, uint16_t colour565) {
  begin_operation();
  return fill(raw, colour565, static_cast<uint8_t>(colour565 >> 8 & 0xF8),
              static_cast<uint8_t>(colour565 >> 3 & 0xFC),
              static_cast<uint8_t>((colour565 & 0x1F) << 3));
}

int TAVIRPELO_FillRawImageWithRgb888(TAVIRPELO_RAWINFO* raw, uint8_t r, uint8_t g, uint8_t b) {
  begin_operation();
  return fill(raw, rgb565(r, g, b), r, g, b);
}

// ---- pixels over pixels ----

int TAVIRPELO_CODEC_Blend(const void* src, void* dst, int srcWidth, int srcHeight, int dstWidth,
                          int dstHeight, int x, int y, int format) {
  begin_operation();
  return blend(src, dst, {srcWidth, srcHeight}, {dstWidth, dstHeight}, x, y, format);
}

int Tavir_Clipping(const void* src, void* dst, const uint8_t* mask, int strideBytes, int width,
                   int height) {
  copy_masked(src, dst, mask, strideBytes, {width, height});
  return 1;
}

int elo_codec_rotation(const TAVIRPELO_RAWINFO* raw, void* dst, int degrees) {
  rotate(*raw, dst, degrees);
  return 1;
}

int TAVIRPELO_CODEC_Rotation(const TAVIRPELO_RAWINFO* raw, void* dst, int degrees) {
  begin_operation();
  if (dst == nullptr || raw == nullptr || raw->pData == nullptr) {
    record_error(ErrorWord::kCodec, TAVIRPELO_CODEC_ARGUMENT);
    return 0;
  }
  return elo_codec_rotation(raw, dst, degrees);
}

// ---- scaling ----

int TAVIRPELO_CODEC_Scale(const void* src, void* dst, int srcWidth, int srcHeight, int srcStride,
                          int dstWidth, int dstHeight, int dstStride, int scaledWidth, int scaledHeight,
                          int format, int anchor, int quality) {
  begin_operation();
  return scale_anchored({src, dst, srcWidth, srcHeight, srcStride, dstWidth, dstHeight, dstStride,
                         scaledWidth, scaledHeight, format, anchor, quality});
}

void PELO_WriteOutputBuf(const uint32_t* words, void* output, int count) {
  write_averages565(words, static_cast<uint8_t*>(output), count);
}

void PELO_WriteRGB888OutputBuf(const uint32_t* words, void* output, int count) {
  write_averages888(words, static_cast<uint8_t*>(output), count);
}

// The family of whole pictures: strides in pixels of `bytes` bytes.
#define PELO_SCALER(Name, bytes, scale)                                                             \
  void Name(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst, int dstWidth,   \
            int dstHeight, int dstStride) {                                                         \
    scale({{static_cast<const uint8_t*>(src), srcWidth, srcHeight, ptrdiff_t{srcStride} * (bytes)}, \
           {static_cast<uint8_t*>(dst), dstWidth, dstHeight, ptrdiff_t{dstStride} * (bytes)}});     \
  }
PELO_SCALER(PELO_Scale_ex, 2, scale565)
PELO_SCALER(PELO_UpScale, 2, enlarge565)
PELO_SCALER(PELO_DownScale, 2, reduce565)
PELO_SCALER(PELO_FastScale_ex, 2, pick565)
PELO_SCALER(PELO_UpScale_1sample, 2, pick565)
PELO_SCALER(PELO_DownScale_1sample, 2, pick565)
PELO_SCALER(PELO_RGB888Scale_ex, 3, scale888)
PELO_SCALER(PELO_RGB888UpScale, 3, scale888)
PELO_SCALER(PELO_RGB888DownScale, 3, scale888)
#undef PELO_SCALER

// ---- cropping ----

int TAVIRPELO_Crop(const void* src, const TAVIRPELO_CROPRECT* rect, void* dst, int dstWidth,
                   int dstHeight, uint32_t option) {
  begin_operation();
  return crop(src, rect, dst, dstWidth, dstHeight, option);
}

int TAVIRPELO_Scale(const void* src, int srcWidth, int srcHeight, void* dst, int dstWidth, int dstHeight,
                    uint32_t option) {
  const TAVIRPELO_CROPRECT whole{srcWidth, srcHeight, 0, 0, srcWidth, srcHeight};
  return TAVIRPELO_Crop(src, &whole, dst, dstWidth, dstHeight, option);
}
