// Decoding a large photograph from memory at each scale, without its thumbnail: baseline, and stored
// progressively.
#include "bench/job.h"
#include "bench/ours.h"

namespace bench {
namespace {

constexpr uint32_t kOption = TAVIRPELO_THUMBNAIL_NEVER;

void register_scale(const std::string& name, const Shared& jpeg, peer::Size size, int format,
                    TJPF peerFormat) {
  auto out = std::make_shared<Bytes>(size.pixels() * 4);
  register_job({name,
                [=] { return decode(TAVIRPELO_DecodeJPEG, *jpeg, format, kOption, size, out->data()); },
                [=](int flags) { return peer::decode(*jpeg, size, peerFormat, flags, out->data()); }});
}

// Progressive data has no scale of three eighths.
void register_scales(const std::string& kind, const Shared& jpeg, bool threeEighths) {
  struct Scale {
    const char* name;
    int eighths;
  };
  const peer::Size full = peer::size_of(*jpeg);
  for (const Scale& scale :
       {Scale{"1/1", 8}, Scale{"1/2", 4}, Scale{"3/8", 3}, Scale{"1/4", 2}, Scale{"1/8", 1}}) {
    if (scale.eighths == 3 && !threeEighths) continue;
    register_scale(kind + " " + scale.name + " RGB", jpeg, full.scaled(scale.eighths), TAVIRPELO_RGB888,
                   TJPF_RGB);
  }
}

}  // namespace

void register_decode_jobs(const Bytes& photograph) {
  const auto baseline = std::make_shared<Bytes>(photograph);
  register_scales("decode", baseline, true);
  register_scale("decode 1/1 BGRA", baseline, peer::size_of(photograph), TAVIRPELO_BGRA8888, TJPF_BGRA);
  const auto progressive = std::make_shared<Bytes>();
  if (!peer::transform(photograph, TJXOP_NONE, TJXOPT_PROGRESSIVE, progressive.get())) return;
  register_scales("progressive", progressive, false);
}

}  // namespace bench
