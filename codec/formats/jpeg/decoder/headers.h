// What stands before the first scan: the parser that fills the decoder state from the marker segments
// (ITU-T T.81 Annex B) and refuses what the decoder cannot do, and the sizes of a decode: what the
// request's fitting makes of the picture, the inverse transform's scale, and the part of the scaled
// picture that is shown.
#pragma once

#include "codec/base/geometry.h"
#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// The headers of a picture: frame, tables, first scan, colour space. 200, or 201 with the state emptied.
int parse_header(PELOJ_JDINFO* jdInfo);

// Goes on to where the next scan's data begin. *status tells whether there are any (200) or the picture
// has no further scan, or none that can be decoded (201); the answer is the marker that decided it.
int parse_to_scan(PELOJ_JDINFO* jdInfo, int* status);

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
