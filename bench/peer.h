// The peer: libjpeg-turbo through its TurboJPEG interface.
#pragma once

#include <turbojpeg.h>

#include <memory>

#include "bench/job.h"

namespace bench::peer {

struct Size {
  int width = 0;  // pixels
  int height = 0;

  size_t pixels() const { return static_cast<size_t>(width) * static_cast<size_t>(height); }
  // At one of the peer's scales.
  Size scaled(int eighths) const { return {(width * eighths + 7) / 8, (height * eighths + 7) / 8}; }
};

// Pixel size of a JPEG; zero when its header cannot be read.
Size size_of(const Bytes& jpeg);

// Decodes at one of the peer's scales into packed pixels of `format`; `pixels` must hold them.
bool decode(const Bytes& jpeg, Size scaled, TJPF format, int flags, uint8_t* pixels);

// Encodes R G B pixels, 4:2:0, with the fixed Huffman tables; returns the size, 0 on failure.
unsigned long encode(const uint8_t* rgb, Size size, int quality, int flags);

// Transforms a JPEG without loss (TJXOP_..., TJXOPT_...); `result`, unless null, receives it.
bool transform(const Bytes& jpeg, int operation, int options, Bytes* result);

// The smallest of the peer's scales, all eighths, at which the picture is at least `width` wide.
Size scale_at_least(Size size, int width);

// Bilinear reduction of R G B pixels, as callers of the peer have to bring along themselves.
void reduce(const uint8_t* from, Size fromSize, uint8_t* to, Size toSize);

}  // namespace bench::peer
