// PNG and BMP pictures of two megapixels, made of the photograph, against libpng and a copying loop.
#include <png.h>

#include <cstdlib>
#include <cstring>
#include <memory>

#include "bench/job.h"
#include "bench/peer.h"
#include "tavirpelo/tavirpelo.h"

namespace bench {
namespace {

constexpr int kWidth = 1632, kHeight = 1224;

Bytes two_megapixels(const Bytes& photograph) {
  Bytes rgb(size_t{kWidth} * kHeight * 3);
  TAVIRPELO_RAWINFO raw{};
  raw.width = kWidth;
  raw.height = kHeight;
  raw.pData = rgb.data();
  raw.format = TAVIRPELO_RGB888;
  const int done =
      TAVIRPELO_DecodeJpegFromBuffer(const_cast<uint8_t*>(photograph.data()),
                                     static_cast<int>(photograph.size()), &raw, TAVIRPELO_FIT_STRETCH);
  return done == 1 ? rgb : Bytes();
}

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

using Shared = std::shared_ptr<Bytes>;

bool decode_ours(int (*decode)(TAVIRPELO_DECINFO*, void*, int, int), Bytes& file, int format,
                 Bytes& out) {
  TAVIRPELO_DECINFO* info = TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, file.data(),
                                                    static_cast<int>(file.size()), format, 0);
  if (info == nullptr) return false;
  const int done = decode(info, out.data(), kWidth, kHeight);
  TAVIRPELO_DestroyDecInfo(info);
  return done == 1;
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
  register_job({name, [=] { return decode_ours(TAVIRPELOI_DecodePNG, *png, format, *out); },
                [=](int) { return decode_libpng(*png, peerFormat, *out); }});
}

void put_le(Bytes& out, size_t at, uint32_t value) {
  for (size_t i = 0; i < 4; ++i) out[at + i] = static_cast<uint8_t>(value >> 8 * i);
}

// Rows from below, as BMP stores them; 4896 bytes need no padding.
void register_bmp(const Bytes& rgb) {
  constexpr size_t kHead = 54, kRow = size_t{kWidth} * 3;
  auto bmp = std::make_shared<Bytes>(kHead + rgb.size());
  put_le(*bmp, 0, 'B' | 'M' << 8);
  put_le(*bmp, 10, kHead);
  put_le(*bmp, 14, 40);
  put_le(*bmp, 18, kWidth);
  put_le(*bmp, 22, kHeight);
  put_le(*bmp, 26, 1 | 24 << 16);
  std::copy(rgb.begin(), rgb.end(), bmp->begin() + kHead);
  auto out = std::make_shared<Bytes>(size_t{kWidth} * kHeight * 4);
  register_job({"BMP 24 bits to RGB",
                [=] { return decode_ours(TAVIRPELOI_DecodeBMP, *bmp, TAVIRPELO_RGB888, *out); },
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
  Bytes rgb = two_megapixels(photograph);
  if (rgb.empty()) return;
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
