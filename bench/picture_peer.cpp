#include "bench/picture_peer.h"

extern "C" {
#include <libavutil/cpu.h>
#include <libavutil/pixfmt.h>
#include <libswscale/swscale.h>
}
#include <libyuv.h>

#include <cstdlib>

#include "codec/pixel/row_stores.h"
#include "tavirpelo/tavirpelo.h"

namespace bench::peer {
namespace {

bool without_simd() {
  return std::getenv("JSIMD_FORCENONE") != nullptr;
}

std::shared_ptr<void> context(Size from, Size to, int format, int method) {
  if (without_simd()) av_force_cpu_flags(0);
  const AVPixelFormat pixels = format == TAVIRPELO_RGB565 ? AV_PIX_FMT_RGB565LE : AV_PIX_FMT_RGB24;
  SwsContext* sws = sws_getContext(from.width, from.height, pixels, to.width, to.height, pixels, method,
                                   nullptr, nullptr, nullptr);
  return std::shared_ptr<void>(sws, [](void* c) { sws_freeContext(static_cast<SwsContext*>(c)); });
}

}  // namespace

Scaler::Scaler(Size from, Size to, int format)
    : accurate_(context(from, to, format, SWS_BILINEAR)),
      fast_(context(from, to, format, SWS_FAST_BILINEAR)),
      from_(from),
      to_(to),
      format_(format) {}

bool Scaler::scale(const uint8_t* source, int stride, uint8_t* target, int flags) const {
  auto* sws = static_cast<SwsContext*>((flags != 0 ? fast_ : accurate_).get());
  const int targetStride = to_.width * pelo::bytes_per_pixel(format_);
  return sws != nullptr &&
         sws_scale(sws, &source, &stride, 0, from_.height, &target, &targetStride) == to_.height;
}

void prepare_libyuv() {
  libyuv::MaskCpuFlags(without_simd() ? 1 : -1);
}

}  // namespace bench::peer
