// Pictures on their way out of a show: from 32-bit pixels onto an R G B canvas, and from there to a
// file.
#include "tools/vss/picture.h"

#include <filesystem>

#include "tools/common/output.h"

namespace vss {
namespace {

// Copies the opaque pixels of a row (B G R A) onto a row of the canvas (R G B).
void copy_opaque(const uint8_t* source, uint8_t* target, int width) {
  for (int i = 0; i < width; ++i, source += 4, target += 3) {
    if (source[3] == 0) continue;
    target[0] = source[2];
    target[1] = source[1];
    target[2] = source[0];
  }
}

bool same_file(const std::string& a, const std::string& b) {
  std::error_code ignored;
  return std::filesystem::equivalent(a, b, ignored);
}

}  // namespace

RawImage create_canvas(Size size, uint8_t grey) {
  RawImage canvas(TAVIRPELO_CreateRawInfo(size.width, size.height, TAVIRPELO_RGB888));
  if (canvas) TAVIRPELO_FillRawImageWithRgb888(canvas.get(), grey, grey, grey);
  return canvas;
}

bool draw_slide(SlideShow& show, int index, TAVIRPELO_RAWINFO& canvas, int x, int y, Size box) {
  size_t stride = static_cast<size_t>(box.width) * 4;
  std::vector<uint8_t> pixels(stride * static_cast<size_t>(box.height));
  if (show.GetDrawble(index, pixels.data(), box.width, box.height) != 1) return false;
  auto* corner = static_cast<uint8_t*>(canvas.pData) +
                 (static_cast<size_t>(y) * canvas.width + static_cast<size_t>(x)) * 3;
  for (size_t row = 0; row < static_cast<size_t>(box.height); ++row) {
    copy_opaque(pixels.data() + row * stride, corner + row * canvas.width * 3, box.width);
  }
  return true;
}

Exit write_jpeg(const SlideShow& show, const std::string& path, const TAVIRPELO_RAWINFO& canvas,
                int quality) {
  tool::CodecBuffer buffer;
  if (!buffer.encode(canvas, quality)) {
    return fail(Exit::kRefused, "{}: cannot encode {}x{} pixels", path, canvas.width, canvas.height);
  }
  return write_output(show, path, buffer.bytes, static_cast<size_t>(buffer.size));
}

Exit write_output(const SlideShow& show, const std::string& path, const uint8_t* bytes, size_t size) {
  if (path != "-" && same_file(path, show.pathName)) {
    return fail(Exit::kRefused, "{}: is the show itself", path);
  }
  return tool::write_bytes(path, bytes, size);
}

}  // namespace vss
