// Files of every colour type, depth and interlacing, written by libpng with filters and levels of its
// own choice, against libpng's reading of them.
#ifdef TAVIR_HAVE_LIBPNG
#include <png.h>

#include <cstring>

#include "tests/png/png_decode.h"

namespace tests {
namespace {

// Rows with gradients and noise, so that every filter pays somewhere.
Bytes sample_rows(std::mt19937& random, size_t rowBytes, size_t height) {
  Bytes rows(rowBytes * height);
  for (size_t i = 0; i < rows.size(); ++i) {
    rows[i] = static_cast<uint8_t>(i % rowBytes / 2 + i / rowBytes * 3 +
                                   (random() % 3 == 0 ? random() % 16 : 0));
  }
  return rows;
}

Bytes write_png(const PngKind& kind, bool interlaced, uint32_t width, uint32_t height, int level,
                std::mt19937& random) {
  Bytes file;
  png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
  png_infop info = png_create_info_struct(png);
  png_set_write_fn(
      png, &file,
      [](png_structp p, png_bytep data, size_t size) {
        append(*static_cast<Bytes*>(png_get_io_ptr(p)), Bytes(data, data + size));
      },
      nullptr);
  png_set_IHDR(png, info, width, height, kind.depth, kind.type, interlaced ? PNG_INTERLACE_ADAM7 : 0, 0,
               0);
  png_set_compression_level(png, level);
  png_set_filter(png, 0, PNG_ALL_FILTERS);
  std::vector<png_color> palette(1u << std::min<int>(kind.depth, 8));
  for (png_color& c : palette)
    c = {static_cast<png_byte>(random()), static_cast<png_byte>(random()),
         static_cast<png_byte>(random())};
  if (kind.type == PNG_COLOR_TYPE_PALETTE)
    png_set_PLTE(png, info, palette.data(), static_cast<int>(palette.size()));
  png_write_info(png, info);
  const size_t rowBytes = png_get_rowbytes(png, info);
  Bytes rows = sample_rows(random, rowBytes, height);
  for (int pass = png_set_interlace_handling(png); pass > 0; --pass) {
    for (uint32_t y = 0; y < height; ++y) png_write_row(png, rows.data() + y * rowBytes);
  }
  png_write_end(png, info);
  png_destroy_write_struct(&png, &info);
  return file;
}

// R, G, B, A of each pixel as libpng reads it; few-bit grey is widened by ones, single bits to black or
// white.
Bytes read_png(const Bytes& file, const PngKind& kind) {
  png_structp png = png_create_read_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
  png_infop info = png_create_info_struct(png);
  std::pair<const Bytes*, size_t> source{&file, 0};
  png_set_read_fn(png, &source, [](png_structp p, png_bytep data, size_t size) {
    auto* from = static_cast<std::pair<const Bytes*, size_t>*>(png_get_io_ptr(p));
    std::memcpy(data, from->first->data() + from->second, size);
    from->second += size;
  });
  png_read_info(png, info);
  const uint32_t width = png_get_image_width(png, info), height = png_get_image_height(png, info);
  const bool fewBits = kind.type == 0 && kind.depth < 8;
  if (kind.type == PNG_COLOR_TYPE_PALETTE) png_set_palette_to_rgb(png);
  png_set_packing(png);
  if (kind.depth == 16) png_set_strip_16(png);
  if (kind.type == 0 || kind.type == 4) png_set_gray_to_rgb(png);
  if ((kind.type & 4) == 0) png_set_add_alpha(png, 255, PNG_FILLER_AFTER);
  const int passes = png_set_interlace_handling(png);
  png_read_update_info(png, info);
  Bytes rows(png_get_rowbytes(png, info) * height);
  for (int pass = 0; pass < passes; ++pass) {
    for (uint32_t y = 0; y < height; ++y)
      png_read_row(png, rows.data() + y * rows.size() / height, nullptr);
  }
  png_destroy_read_struct(&png, &info, nullptr);
  EXPECT_EQ(size_t{width} * height * 4, rows.size());
  for (size_t i = 0; fewBits && i < rows.size(); ++i) {
    const int value = rows[i];
    if (i % 4 == 3) continue;
    // libpng spread the bits over the byte; the top ones are the sample.
    rows[i] = kind.depth == 1 ? rows[i] : static_cast<uint8_t>(value | ((1 << (8 - kind.depth)) - 1));
  }
  return rows;
}

TEST(PngAgainstLibpng, EveryKindInterlacedOrNot) {
  std::mt19937 random(11);
  for (const PngKind& kind : kPngKinds) {
    for (const bool interlaced : {false, true}) {
      for (const int level : {0, 1, 6, 9}) {
        const int width = 1 + static_cast<int>(random() % 90),
                  height = 1 + static_cast<int>(random() % 70);
        const Bytes file = write_png(kind, interlaced, static_cast<uint32_t>(width),
                                     static_cast<uint32_t>(height), level, random);
        const Decode got = decode_png(file, width, height, TAVIRPELO_RGBA8888);
        ASSERT_EQ(1, got.answer);
        ASSERT_EQ(read_png(file, kind), got.pixels)
            << "type " << int{kind.type} << " depth " << int{kind.depth} << " interlaced " << interlaced
            << " level " << level << " " << width << "x" << height;
      }
    }
  }
}

}  // namespace
}  // namespace tests
#endif
