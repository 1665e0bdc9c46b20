// Decoding a large photograph from memory at each scale, without its thumbnail.
#include <memory>

#include "bench/job.h"
#include "bench/peer.h"
#include "tavirpelo/tavirpelo.h"

namespace bench {
namespace {

struct Scale {
  const char* name;
  int eighths;
};

constexpr Scale kScales[] = {{"1/1", 8}, {"1/2", 4}, {"3/8", 3}, {"1/4", 2}, {"1/8", 1}};

bool decode_rgb(const Bytes& jpeg, TAVIRPELO_RAWINFO* raw) {
  return TAVIRPELO_DecodeJpegFromBuffer(const_cast<uint8_t*>(jpeg.data()), static_cast<int>(jpeg.size()),
                                        raw, TAVIRPELO_THUMBNAIL_NEVER) == 1;
}

bool decode_bgra(const Bytes& jpeg, uint8_t* pixels, peer::Size size) {
  TAVIRPELO_DECINFO* info = TAVIRPELO_CreateDecInfo(
      TAVIRPELO_IO_MEMORY, const_cast<uint8_t*>(jpeg.data()), static_cast<int>(jpeg.size()),
      TAVIRPELO_BGRA8888, TAVIRPELO_THUMBNAIL_NEVER);
  if (!info) return false;
  int done = TAVIRPELO_DecodeJPEG(info, pixels, size.width, size.height);
  TAVIRPELO_DestroyDecInfo(info);
  return done == 1;
}

}  // namespace

void register_decode_jobs(const Bytes& photograph) {
  peer::Size full = peer::size_of(photograph);
  for (const Scale& scale : kScales) {
    peer::Size size{(full.width * scale.eighths + 7) / 8, (full.height * scale.eighths + 7) / 8};
    std::shared_ptr<TAVIRPELO_RAWINFO> raw(
        TAVIRPELO_CreateRawInfo(size.width, size.height, TAVIRPELO_RGB888), TAVIRPELO_DestroyRawInfo);
    if (!raw) continue;
    register_job({std::string("decode ") + scale.name + " RGB",
                  [&photograph, raw] { return decode_rgb(photograph, raw.get()); },
                  [&photograph, raw, size](int flags) {
                    auto* pixels = static_cast<uint8_t*>(raw->pData);
                    return peer::decode(photograph, size, TJPF_RGB, flags, pixels);
                  }});
  }
  auto pixels =
      std::make_shared<Bytes>(static_cast<size_t>(full.width) * static_cast<size_t>(full.height) * 4);
  register_job({"decode 1/1 BGRA",
                [&photograph, pixels, full] { return decode_bgra(photograph, pixels->data(), full); },
                [&photograph, pixels, full](int flags) {
                  return peer::decode(photograph, full, TJPF_BGRA, flags, pixels->data());
                }});
}

}  // namespace bench
