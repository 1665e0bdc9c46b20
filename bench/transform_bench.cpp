// The photograph stored progressively, at each scale, and turned without decoding it.
#include <turbojpeg.h>

#include <memory>

#include "bench/job.h"
#include "bench/peer.h"
#include "tavirpelo/tavirpelo.h"

namespace bench {
namespace {

using Shared = std::shared_ptr<Bytes>;

// What the peer's lossless transform makes of a JPEG.
bool transform(const Bytes& jpeg, int operation, int options, Bytes* result) {
  tjhandle handle = tjInitTransform();
  tjtransform wanted{};
  wanted.op = operation;
  wanted.options = options;
  unsigned char* out = nullptr;
  unsigned long size = 0;
  const bool done = tjTransform(handle, jpeg.data(), jpeg.size(), 1, &out, &size, &wanted, 0) == 0;
  if (done && result != nullptr) result->assign(out, out + size);
  tjFree(out);
  tjDestroy(handle);
  return done;
}

void register_progressive(const Bytes& photograph) {
  auto progressive = std::make_shared<Bytes>();
  if (!transform(photograph, TJXOP_NONE, TJXOPT_PROGRESSIVE, progressive.get())) return;
  const peer::Size full = peer::size_of(photograph);
  struct Scale {
    const char* name;
    int eighths;
  };
  for (const Scale& scale : {Scale{"1/1", 8}, Scale{"1/2", 4}, Scale{"1/4", 2}, Scale{"1/8", 1}}) {
    const peer::Size size{(full.width * scale.eighths + 7) / 8, (full.height * scale.eighths + 7) / 8};
    std::shared_ptr<TAVIRPELO_RAWINFO> raw(
        TAVIRPELO_CreateRawInfo(size.width, size.height, TAVIRPELO_RGB888), TAVIRPELO_DestroyRawInfo);
    if (!raw) continue;
    register_job({std::string("progressive ") + scale.name + " RGB",
                  [progressive, raw] {
                    return TAVIRPELO_DecodeJpegFromBuffer(progressive->data(),
                                                          static_cast<int>(progressive->size()),
                                                          raw.get(), TAVIRPELO_THUMBNAIL_NEVER) == 1;
                  },
                  [progressive, raw, size](int flags) {
                    return peer::decode(*progressive, size, TJPF_RGB, flags,
                                        static_cast<uint8_t*>(raw->pData));
                  }});
  }
}

bool turn(Bytes& jpeg, peer::Size size, int angle, int flip) {
  ELO_DESTINATION destination{ELO_TO_MEMORY, 0, 0, 0, nullptr, nullptr};
  const int done = elo_rotate_jpeg(jpeg.data(), static_cast<int>(jpeg.size()), size.width, size.height,
                                   &destination, angle, flip, nullptr);
  TAVIRPELO_OsFree(destination.buffer);
  return done == 1;
}

}  // namespace

void register_transform_jobs(const Bytes& photograph) {
  register_progressive(photograph);
  auto source = std::make_shared<Bytes>(photograph);
  const peer::Size size = peer::size_of(photograph);
  struct Turn {
    const char* name;
    int angle, flip, operation;
  };
  for (const Turn& t : {Turn{"rotate 90", 90, 0, TJXOP_ROT90}, Turn{"rotate 180", 180, 0, TJXOP_ROT180},
                        Turn{"mirror", 0, 1, TJXOP_HFLIP}}) {
    register_job({t.name, [=] { return turn(*source, size, t.angle, t.flip); },
                  [=](int) { return transform(*source, t.operation, 0, nullptr); }});
  }
}

}  // namespace bench
