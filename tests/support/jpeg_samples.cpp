#include "tests/support/jpeg_samples.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>

#ifdef TAVIR_HAVE_LIBJPEG
#include <jpeglib.h>
#endif

namespace tests {

Bytes sample_pixels(int width, int height) {
  Bytes pixels;
  uint32_t noise = 12345;
  for (int y = 0; y < height; ++y) {
    for (int x = 0; x < width; ++x) {
      noise = noise * 1664525 + 1013904223;
      const int edge = (x / 9 + y / 7) % 2 * 60;
      for (const int v : {x * 5 + edge, y * 3 + edge + static_cast<int>(noise >> 28), x + y * 2})
        pixels.push_back(static_cast<uint8_t>(v % 256));
    }
  }
  return pixels;
}

Bytes encode_pixels(const Bytes& pixels, int width, int height, uint32_t format,
                    const TAVIRPELO_ENCOPTION& options, int capacity) {
  const Bytes copy(pixels);  // a heap block of its own: reads past it are seen
  const TAVIRPELO_RAWINFO raw = raw_image(copy, width, height, format);
  auto* buffer = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(static_cast<size_t>(capacity)));
  if (buffer == nullptr) return {};
  Bytes jpeg;
  if (elo_enc_jpeg_to_buffer_ex(&raw, &buffer, &capacity, &options)) {
    jpeg.assign(buffer, buffer + capacity);
  } else {
    EXPECT_EQ(nullptr, buffer);
    EXPECT_EQ(0, capacity);
  }
  TAVIRPELO_OsFree(buffer);
  return jpeg;
}

Bytes encode_own(int width, int height, int quality, bool grey) {
  return encode_pixels(sample_pixels(width, height), width, height,
                       grey ? TAVIRPELO_GREY8 : TAVIRPELO_RGB888, {quality, nullptr, 0});
}

#ifdef TAVIR_HAVE_LIBJPEG
namespace {

// Scan scripts, by JpegScans.
const std::vector<jpeg_scan_info> kScans[] = {
    {},
    {{1, {0}, 0, 63, 0, 0}, {1, {1}, 0, 63, 0, 0}, {1, {2}, 0, 63, 0, 0}},
    {{1, {0}, 0, 63, 0, 0}, {2, {1, 2}, 0, 63, 0, 0}},
    {{1, {2}, 0, 63, 0, 0}, {2, {0, 1}, 0, 63, 0, 0}}};

// A JPEG whose header libjpeg has read.
struct Decompressor : jpeg_decompress_struct {
  explicit Decompressor(const Bytes& jpeg) {
    err = jpeg_std_error(&errors);
    errors.output_message = [](j_common_ptr) {};  // of cut data
    jpeg_create_decompress(this);
    jpeg_mem_src(this, jpeg.data(), static_cast<unsigned long>(jpeg.size()));
    jpeg_read_header(this, TRUE);
  }
  ~Decompressor() {
    jpeg_finish_decompress(this);
    jpeg_destroy_decompress(this);
  }
  Decompressor(const Decompressor&) = delete;
  jpeg_error_mgr errors;
};

}  // namespace

Bytes encode_libjpeg(int width, int height, const JpegStyle& style) {
  jpeg_compress_struct c;
  jpeg_error_mgr errors;
  c.err = jpeg_std_error(&errors);
  jpeg_create_compress(&c);
  unsigned char* memory = nullptr;
  unsigned long size = 0;
  jpeg_mem_dest(&c, &memory, &size);
  c.image_width = static_cast<JDIMENSION>(width);
  c.image_height = static_cast<JDIMENSION>(height);
  c.input_components = 3;
  c.in_color_space = JCS_RGB;
  jpeg_set_defaults(&c);
  jpeg_set_colorspace(&c, style.components == 1 ? JCS_GRAYSCALE : style.rgb ? JCS_RGB : JCS_YCbCr);
  jpeg_set_quality(&c, style.quality, TRUE);
  c.comp_info[0].h_samp_factor = style.h;
  c.comp_info[0].v_samp_factor = style.v;
  c.restart_interval = static_cast<unsigned>(style.restartInterval);
  c.optimize_coding = style.optimise ? TRUE : FALSE;
  if (style.progressive) jpeg_simple_progression(&c);
  if (const auto& scans = kScans[static_cast<size_t>(style.scans)]; !scans.empty()) {
    c.scan_info = scans.data();
    c.num_scans = static_cast<int>(scans.size());
  }
  jpeg_start_compress(&c, TRUE);
  Bytes pixels = sample_pixels(width, height);
  for (int y = 0; y < height; ++y) {
    JSAMPROW row = pixels.data() + static_cast<size_t>(3 * width) * static_cast<size_t>(y);
    jpeg_write_scanlines(&c, &row, 1);
  }
  jpeg_finish_compress(&c);
  jpeg_destroy_compress(&c);
  Bytes jpeg(memory, memory + size);
  std::free(memory);
  return jpeg;
}

Decoded decode_libjpeg(const Bytes& jpeg, int numerator) {
  Decompressor d(jpeg);
  d.scale_num = static_cast<unsigned>(numerator);
  d.scale_denom = 8;
  d.do_fancy_upsampling = FALSE;
  jpeg_start_decompress(&d);
  const size_t stride = size_t{d.output_width} * static_cast<size_t>(d.output_components);
  Bytes pixels(stride * d.output_height);
  while (d.output_scanline < d.output_height) {
    JSAMPROW row = pixels.data() + stride * d.output_scanline;
    jpeg_read_scanlines(&d, &row, 1);
  }
  return {static_cast<int>(d.output_width), static_cast<int>(d.output_height), d.output_components,
          pixels};
}

std::vector<Plane> read_coefficients(const Bytes& jpeg) {
  Decompressor d(jpeg);
  jvirt_barray_ptr* arrays = jpeg_read_coefficients(&d);
  std::vector<Plane> planes;
  for (int c = 0; c < d.num_components; ++c) {
    const jpeg_component_info& info = d.comp_info[c];
    // A component whose scan is cut off has not taken its table.
    const uint16_t* quant = d.quant_tbl_ptrs[info.quant_tbl_no]->quantval;
    Plane plane{info.h_samp_factor,
                info.v_samp_factor,
                static_cast<int>(info.width_in_blocks),
                static_cast<int>(info.height_in_blocks),
                {quant, quant + 64},
                {}};
    for (JDIMENSION row = 0; row < info.height_in_blocks; ++row) {
      JBLOCKARRAY blocks =
          d.mem->access_virt_barray(reinterpret_cast<j_common_ptr>(&d), arrays[c], row, 1, FALSE);
      for (JDIMENSION column = 0; column < info.width_in_blocks; ++column)
        plane.coefficients.insert(plane.coefficients.end(), blocks[0][column], blocks[0][column] + 64);
    }
    planes.push_back(plane);
  }
  return planes;
}
#endif

Bytes sample_jpeg(int width, int height, bool grey) {
#ifdef TAVIR_HAVE_LIBJPEG
  return encode_libjpeg(width, height, {.components = grey ? 1 : 3});
#else
  return encode_own(width, height, 90, grey);
#endif
}

double psnr(const Bytes& a, const Bytes& b) {
  double sum = 0;
  for (size_t i = 0; i < a.size(); ++i) sum += (a[i] - b[i]) * (a[i] - b[i]);
  return sum == 0 ? 99 : 10 * std::log10(255.0 * 255.0 * static_cast<double>(a.size()) / sum);
}

}  // namespace tests
