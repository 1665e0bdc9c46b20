// PNG and BMP pictures of two megapixels, made of the photograph, against libpng and a copying loop.
#include <png.h>

#include <cstdlib>
#include <cstring>
#include <memory>

#include "bench/job.h"
#include "bench/ours.h"
#include "codec/base/byte_order.h"

namespace bench {
namespace {

constexpr int kWidth = 1632, kHeight = 1224;
constexpr peer::Size kSize{kWidth, kHeight};

void append(png_structp png, png_bytep data, size_t size) {
  auto* out = static_cast<Bytes*>(png_get_io_ptr(png));
  out->insert(out->end(), data, data + size);
}

// A PNG with libpng's own choice of filters and level.
Bytes encode_png(Bytes& rows, int colourType, int interlace) {
  Bytes file;
  png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
  png_infop info = png_create_info_struct(png);
  png_set_write_fn(png, &file, append, nullptr);
  png_set_IHDR(png, info, kWidth, kHeight, 8, colourType, interlace, 0, 0);
  png_color palette[256];
  for (int i = 0; i < 256; ++i) {  // 3-3-2 bits
    palette[i] = {static_cast<png_byte>((i >> 5) * 36), static_cast<png_byte>((i >> 2 & 7) * 36),
                  static_cast<png_byte>((i & 3) * 85)};
  }
  if (colourType == PNG_COLOR_TYPE_PALETTE) png_set_PLTE(png, info, palette, 256);
  png_write_info(png, info);
  const size_t rowBytes = rows.size() / kHeight;
  for (int pass = interlace != 0 ? png_set_interlace_handling(png) : 1; pass > 0; --pass) {
    for (size_t y = 0; y < kHeight; ++y) png_write_row(png, rows.data() + y * rowBytes);
  }
  png_write_end(png, info);
  png_destroy_write_struct(&png, &info);
  return file;
}

Bytes quantised(const Bytes& rgb) {
  Bytes indices(rgb.size() / 3);
  for (size_t i = 0; i < indices.size(); ++i) {
    indices[i] =
        static_cast<uint8_t>((rgb[3 * i] & 0xE0) | (rgb[3 * i + 1] >> 5 << 2) | rgb[3 * i + 2] >> 6);
  }
  return indices;
}

bool decode_libpng(const Bytes& file, uint32_t format, Bytes& out) {
  png_image image{};
  image.version = PNG_IMAGE_VERSION;
  if (!png_image_begin_read_from_memory(&image, file.data(), file.size())) return false;
  image.format = format;
  return png_image_finish_read(&image, nullptr, out.data(), 0, nullptr) != 0;
}

void register_png(const char* name, Bytes file, int format, uint32_t peerFormat) {
  auto png = std::make_shared<Bytes>(std::move(file));
  auto out = std::make_shared<Bytes>(size_t{kWidth} * kHeight * 4);
  register_job({name, [=] { return decode(TAVIRPELOI_DecodePNG, *png, format, 0, kSize, out->data()); },
                [=](int) { return decode_libpng(*png, peerFormat, *out); }});
}

// Rows from below, as BMP stores them; 4896 bytes need no padding.
void register_bmp(const Bytes& rgb) {
  constexpr size_t kHead = 54, kRow = size_t{kWidth} * 3;
  auto bmp = std::make_shared<Bytes>(kHead + rgb.size());
  pelo::store_le32(bmp->data() + 0, 'B' | 'M' << 8);
  pelo::store_le32(bmp->data() + 10, kHead);
  pelo::store_le32(bmp->data() + 14, 40);
  pelo::store_le32(bmp->data() + 18, kWidth);
  pelo::store_le32(bmp->data() + 22, kHeight);
  pelo::store_le32(bmp->data() + 26, 1 | 24 << 16);
  std::copy(rgb.begin(), rgb.end(), bmp->begin() + kHead);
  auto out = std::make_shared<Bytes>(size_t{kWidth} * kHeight * 4);
  register_job(
      {"BMP 24 bits to RGB",
       [=] { return decode(TAVIRPELOI_DecodeBMP, *bmp, TAVIRPELO_RGB888, 0, kSize, out->data()); },
       [=](int) {
         for (size_t y = 0; y < kHeight; ++y) {
           const uint8_t* in = bmp->data() + kHead + (kHeight - 1 - y) * kRow;
           uint8_t* pixel = out->data() + y * kRow;
           for (size_t x = 0; x < kRow; x += 3) {
             pixel[x] = in[x + 2];
             pixel[x + 1] = in[x + 1];
             pixel[x + 2] = in[x];
           }
         }
         return true;
       }});
}

}  // namespace

void register_png_jobs(const Bytes& photograph) {
  Bytes rgb = pixels_of(photograph, kSize, TAVIRPELO_RGB888);
  Bytes indices = quantised(rgb);
  const Bytes truecolour = encode_png(rgb, PNG_COLOR_TYPE_RGB, PNG_INTERLACE_NONE);
  register_png("PNG truecolour to RGB", truecolour, TAVIRPELO_RGB888, PNG_FORMAT_RGB);
  register_png("PNG truecolour to BGRA", truecolour, TAVIRPELO_BGRA8888, PNG_FORMAT_BGRA);
  register_png("PNG palette to RGB", encode_png(indices, PNG_COLOR_TYPE_PALETTE, PNG_INTERLACE_NONE),
               TAVIRPELO_RGB888, PNG_FORMAT_RGB);
  register_png("PNG Adam7 to RGB", encode_png(rgb, PNG_COLOR_TYPE_RGB, PNG_INTERLACE_ADAM7),
               TAVIRPELO_RGB888, PNG_FORMAT_RGB);
  register_bmp(rgb);
}

}  // namespace bench
