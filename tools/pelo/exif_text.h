// EXIF fields as text and as JSON.
#pragma once

#include <string>

#include "tavirpelo/tavirpelo.h"

namespace pelo_tool {

// A line for every field that the picture has, each after `indent`.
std::string exif_lines(const TAVIRPELO_EXIFINFO& info, const std::string& indent);

// The same as a JSON object: rationals as [numerator, denominator], coordinates in degrees.
std::string exif_json(const TAVIRPELO_EXIFINFO& info);

}  // namespace pelo_tool
