// Operations on pictures in memory, two megapixels, against libswscale and libyuv.
#include <libyuv.h>

#include <memory>

#include "bench/ours.h"
#include "bench/picture_peer.h"

namespace bench {
namespace {

constexpr peer::Size kLarge{1632, 1224}, kSmall{480, 360}, kSquare{1428, 1428};
constexpr int kBytes[] = {2, 3};  // a pixel of format 0 and 1

Shared share(Bytes bytes) {
  return std::make_shared<Bytes>(std::move(bytes));
}
Shared room_for(peer::Size size) {
  return share(Bytes(size.pixels() * 4));
}

void register_scaling(const char* name, const Bytes& photograph, int format, int quality) {
  const Shared in = share(pixels_of(photograph, kLarge, format)), out = room_for(kSmall);
  const auto sws = std::make_shared<peer::Scaler>(kLarge, kSmall, format);
  const int stride = kLarge.width * kBytes[format];
  register_job({name,
                [=] {
                  if (quality == 0) {
                    return TAVIRPELO_CODEC_Scale(in->data(), out->data(), kLarge.width, kLarge.height,
                                                 stride, kSmall.width, kSmall.height,
                                                 kSmall.width * kBytes[format], kSmall.width,
                                                 kSmall.height, format, 0, quality) == 1;
                  }
                  (format == TAVIRPELO_RGB565 ? PELO_Scale_ex : PELO_RGB888Scale_ex)(
                      in->data(), kLarge.width, kLarge.height, kLarge.width, out->data(), kSmall.width,
                      kSmall.height, kSmall.width);
                  return true;
                },
                [=](int flags) { return sws->scale(in->data(), stride, out->data(), flags); }});
}

void register_enlarging(const char* name, const Bytes& photograph, int format) {
  const Shared in = share(pixels_of(photograph, kSmall, format)), out = room_for(kLarge);
  const auto sws = std::make_shared<peer::Scaler>(kSmall, kLarge, format);
  register_job({name,
                [=] {
                  (format == TAVIRPELO_RGB565 ? PELO_Scale_ex : PELO_RGB888Scale_ex)(
                      in->data(), kSmall.width, kSmall.height, kSmall.width, out->data(), kLarge.width,
                      kLarge.height, kLarge.width);
                  return true;
                },
                [=](int flags) {
                  return sws->scale(in->data(), kSmall.width * kBytes[format], out->data(), flags);
                }});
}

// The peer blends four bytes over four, ours four over three.
void register_blend(const Bytes& photograph) {
  const Shared in = share(pixels_of(photograph, kLarge, TAVIRPELO_RGBA8888));
  for (size_t i = 3; i < in->size(); i += 4) (*in)[i] = static_cast<uint8_t>(i / 4);
  const Shared out = room_for(kLarge);
  constexpr int kStride = kLarge.width * 4;
  register_job({"blend with alpha over RGB",
                [=] {
                  return TAVIRPELO_CODEC_Blend(in->data(), out->data(), kLarge.width, kLarge.height,
                                               kLarge.width, kLarge.height, 0, 0,
                                               TAVIRPELO_ARGB8888) == 1;
                },
                [=](int) {
                  return libyuv::ARGBBlend(in->data(), kStride, out->data(), kStride, out->data(),
                                           kStride, kLarge.width, kLarge.height) == 0;
                }});
}

// Ours turns by any angle; the peer by quarters.
void register_rotation(const Bytes& photograph) {
  const Shared in = share(pixels_of(photograph, kSquare, TAVIRPELO_RGBA8888));
  const Shared out = room_for(kSquare);
  constexpr int kStride = kSquare.width * 4;
  register_job(
      {"rotate RGBA by 90 degrees",
       [=] {
         const TAVIRPELO_RAWINFO raw{kSquare.width, kSquare.height, in->data(), TAVIRPELO_RGBA8888};
         return TAVIRPELO_CODEC_Rotation(&raw, out->data(), 90) == 1;
       },
       [=](int) {
         return libyuv::ARGBRotate(in->data(), kStride, out->data(), kStride, kSquare.width,
                                   kSquare.height, libyuv::kRotate90) == 0;
       }});
}

// Planes, or the same bytes as a plane of pairs.
void register_frames(const Bytes& photograph) {
  const Shared in = share(pixels_of(photograph, kLarge, TAVIRPELO_YUV420));
  const Shared out = room_for(kLarge);
  constexpr int kWidth = kLarge.width, kHeight = kLarge.height, kPixels = kWidth * kHeight;
  const uint8_t* chroma = in->data() + kPixels;
  register_job({"camera frame, planes",
                [=] { return elo_OrbYUV420toRGB565(in->data(), kWidth, kHeight, out->data()) == 1; },
                [=](int) {
                  return libyuv::I420ToRGB565(in->data(), kWidth, chroma, kWidth / 2,
                                              chroma + kPixels / 4, kWidth / 2, out->data(), kWidth * 2,
                                              kWidth, kHeight) == 0;
                }});
  register_job({"camera frame, pairs",
                [=] { return elo_OrbPYV0420toRGB565(in->data(), kWidth, kHeight, out->data()) == 1; },
                [=](int) {
                  return libyuv::NV12ToRGB565(in->data(), kWidth, chroma, kWidth, out->data(),
                                              kWidth * 2, kWidth, kHeight) == 0;
                }});
}

}  // namespace

void register_raw_jobs(const Bytes& photograph) {
  peer::prepare_libyuv();
  register_scaling("scale 2 MP to 480, RGB565 nearest", photograph, TAVIRPELO_RGB565, 0);
  register_scaling("scale 2 MP to 480, RGB565 average", photograph, TAVIRPELO_RGB565, 1);
  register_scaling("scale 2 MP to 480, RGB888 nearest", photograph, TAVIRPELO_RGB888, 0);
  register_scaling("scale 2 MP to 480, RGB888 average", photograph, TAVIRPELO_RGB888, 1);
  register_enlarging("scale 480 to 2 MP, RGB565 average", photograph, TAVIRPELO_RGB565);
  register_enlarging("scale 480 to 2 MP, RGB888 average", photograph, TAVIRPELO_RGB888);
  register_blend(photograph);
  register_rotation(photograph);
  register_frames(photograph);
}

}  // namespace bench
