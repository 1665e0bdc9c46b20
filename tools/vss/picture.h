// Pictures on their way out of a show: drawing, encoding, writing.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "slideshow/SlideShow.h"
#include "tools/common/codec_objects.h"
#include "tools/vss/arguments.h"
#include "tools/vss/exit_code.h"

namespace vss {

using tool::RawImage;

// A picture of one colour, R G B bytes; null when memory is short.
RawImage create_canvas(Size size, uint8_t grey);

// Draws picture `index` fitted into a box of `box` pixels whose corner is (x, y) of the canvas; what the
// picture leaves of the box keeps the canvas's colour. False when it cannot be decoded.
bool draw_slide(SlideShow& show, int index, TAVIRPELO_RAWINFO& canvas, int x, int y, Size box);

// Encodes the canvas and writes it as write_output does.
Exit write_jpeg(const SlideShow& show, const std::string& path, const TAVIRPELO_RAWINFO& canvas,
                int quality);

// Writes a file, or standard output for "-". The show's own file is refused.
Exit write_output(const SlideShow& show, const std::string& path, const uint8_t* bytes, size_t size);

}  // namespace vss
