// The peers of operations on pixels: libswscale and libyuv. JSIMD_FORCENONE, which libjpeg-turbo reads,
// keeps them from their SIMD code as well.
#pragma once

#include <memory>

#include "bench/job.h"
#include "bench/peer.h"

namespace bench::peer {

// Scales packed pictures of one format (0: RGB565, 1: RGB888), set up once as players do: bilinear, or
// with `flags` its fast variant. `stride` is the source's, in bytes.
class Scaler {
 public:
  Scaler(Size from, Size to, int format);
  bool scale(const uint8_t* source, int stride, uint8_t* target, int flags) const;

 private:
  std::shared_ptr<void> accurate_, fast_;
  Size from_, to_;
  int format_;
};

// To be called before libyuv is used.
void prepare_libyuv();

}  // namespace bench::peer
