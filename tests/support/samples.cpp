#include "tests/support/samples.h"

#include <algorithm>

#include "tests/support/exif_builder.h"
#include "tests/support/gif_builder.h"
#include "tests/support/jpeg_samples.h"
#include "tests/support/png_builder.h"

namespace tests {
namespace {

// An image that leaves parts of the screen above and below it.
Bytes framed_gif() {
  GifFile file = sample_gif(30, 6, 6);
  file.height = 20;
  file.images[0].top = 5;
  return file.bytes();
}

// Chunks and blocks of DEFLATE end at odd places.
Bytes png_file(uint8_t type, uint8_t depth, bool interlaced, size_t idatSize) {
  const PngImage image = random_png_image(9, type, depth, 31, 33, interlaced, type == 3);
  const Bytes lines = png_scanlines(image, [](size_t row) { return row % 5; });
  return build_png(image, zlib_fixed(lines, 500), idatSize);
}

std::vector<Sample> make_samples() {
  const Size jpeg{40, 36}, gif{23, 19}, png{31, 33};
  std::vector<Sample> all = {
      {"jpeg, baseline", encode_own(40, 36, 80), jpeg},
      {"jpeg, grey", encode_own(40, 36, 60, true), jpeg},
      {"jpeg with EXIF", full_exif_jpeg(true), {16, 16}},
      {"jpeg with EXIF, little endian", full_exif_jpeg(false), {16, 16}},
      {"png, truecolour", png_file(2, 8, false, 300), png},
      {"png, palette", png_file(3, 4, false, SIZE_MAX), png},
      {"png, alpha, interlaced", png_file(6, 8, true, 40), png, true},
      {"gif", animated_gif().bytes(), gif},
      {"gif, interlaced", animated_gif(true).bytes(), gif, true},
      {"gif, framed", framed_gif(), {30, 20}},
      {"bmp", bmp_file(21, 14), {21, 14}},
      {"wbmp", wbmp_file(21, 14), {21, 14}},
  };
#ifdef TAVIR_HAVE_LIBJPEG
  const std::pair<const char*, JpegStyle> styles[] = {
      {"restarts", {.h = 1, .restartInterval = 3}},
      {"progressive", {.restartInterval = 2, .progressive = true}},
      {"progressive, grey", {.components = 1, .progressive = true}},
      {"a scan each", {.restartInterval = 3, .scans = JpegScans::kSeparate, .optimise = true}},
      {"chroma first", {.scans = JpegScans::kChromaFirst}},
      {"4:1:1", {.h = 4, .v = 1, .optimise = true}},
      {"RGB", {.h = 1, .v = 1, .rgb = true}}};
  for (const auto& [name, style] : styles)
    all.push_back({std::string("jpeg, ") + name, encode_libjpeg(40, 36, style), jpeg});
#endif
  for (Sample& sample : all) sample.file.shrink_to_fit();  // reads past the end are seen
  return all;
}

}  // namespace

const std::vector<Sample>& samples() {
  static const std::vector<Sample> all = make_samples();
  return all;
}

const Sample& sample(std::string_view name) {
  return *std::find_if(samples().begin(), samples().end(),
                       [&](const Sample& s) { return s.name == name; });
}

Bytes bmp_file(int width, int height) {
  const int rowBytes = (width * 3 + 3) / 4 * 4;
  ByteWriter file(false);
  file.text("BM").u32(54 + rowBytes * height).u32(0).u32(54).u32(40).u32(width).u32(height);
  file.u16(1).u16(24).block(Bytes(24));
  return file.block(random_bytes(static_cast<size_t>(rowBytes * height), 1));
}

Bytes wbmp_file(int width, int height) {
  const size_t bytes = static_cast<size_t>((width + 7) / 8 * height);
  return ByteWriter().u16(0).u8(width).u8(height).block(random_bytes(bytes, 1));
}

}  // namespace tests
