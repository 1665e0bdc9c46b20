// A picture on its way into a show: measured, decoded to its display size, encoded again.
#pragma once

#include "slideshow/SlideShow.h"
#include "slideshow/codec_objects.h"

namespace pelo::slideshow {

// Where a picture comes from: a path, or bytes.
struct PictureSource {
  const char* path;  // null for bytes
  void* data;
  int length;
};

// Fills a fresh entry from the source, all but its offset; in file mode `jpeg` receives the stored data.
// False when the source cannot be read, is no picture, or memory is short.
[[nodiscard]] bool make_picture(const SlideShow& show, const PictureSource& source, const char* name,
                                char flag, subfileInfo& entry, JpegBytes& jpeg);

}  // namespace pelo::slideshow
