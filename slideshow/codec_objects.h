// Owners of the codec's objects, and of files that the store reads beside its container.
#pragma once

#include <cstdint>
#include <cstdio>
#include <memory>

#include "slideshow/vss_wrappers.h"
#include "tavirpelo/tavirpelo.h"

namespace pelo::slideshow {

// Calls one function on what it is given to end, whatever that answers.
template <auto End>
struct EndBy {
  template <class Object>
  void operator()(Object* object) const {
    (void)End(object);
  }
};

using DecInfo = std::unique_ptr<TAVIRPELO_DECINFO, EndBy<TAVIRPELO_DestroyDecInfo>>;
using RawImage = std::unique_ptr<TAVIRPELO_RAWINFO, EndBy<TAVIRPELO_DestroyRawInfo>>;

// JPEG data in the buffer that the encoder was given or took in its place.
using JpegBytes = std::unique_ptr<uint8_t, VssFree>;

using Stream = std::unique_ptr<FILE, EndBy<vss_fclose>>;

}  // namespace pelo::slideshow
