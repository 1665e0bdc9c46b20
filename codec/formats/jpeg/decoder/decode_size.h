// Sizes of a decode: what the request's fitting makes of the picture, the inverse transform's scale, and
// the part of the scaled picture that is shown.
#pragma once

#include "codec/base/geometry.h"
#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// The output size of a picture in a request (already swapped for sideways rotations). Unlike the other
// formats', a picture whose proportions match the request within a pixel takes it whole under every
// fitting, and no fitting but stretch enlarges.
Size fit_output(Size image, Size request, uint32_t option);

// The smallest scale that still covers the output.
Scale covering_scale(Size image, Size output);

// The scale that a decode mode makes of it.
Scale mode_scale(Scale scale, int decMode);

// What a request says about sizes.
struct SizeWishes {
  Size buffer;
  uint32_t rotation;
  uint32_t option;  // fitting
  int decMode;
};

[[nodiscard]] Sizes choose_sizes(const Frame& frame, FrameType type, const SizeWishes& wishes);

}  // namespace pelo::jpeg
