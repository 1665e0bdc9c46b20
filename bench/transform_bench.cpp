// The photograph turned without decoding it.
#include <turbojpeg.h>

#include "bench/job.h"
#include "bench/peer.h"
#include "tavirpelo/tavirpelo.h"

namespace bench {
namespace {

bool turn(Bytes& jpeg, peer::Size size, int angle, int flip) {
  ELO_DESTINATION destination{ELO_TO_MEMORY, 0, 0, 0, nullptr, nullptr};
  const int done = elo_rotate_jpeg(jpeg.data(), static_cast<int>(jpeg.size()), size.width, size.height,
                                   &destination, angle, flip, nullptr);
  TAVIRPELO_OsFree(destination.buffer);
  return done == 1;
}

}  // namespace

void register_transform_jobs(const Bytes& photograph) {
  auto source = std::make_shared<Bytes>(photograph);
  const peer::Size size = peer::size_of(photograph);
  struct Turn {
    const char* name;
    int angle, flip, operation;
  };
  for (const Turn& t : {Turn{"rotate 90", 90, 0, TJXOP_ROT90}, Turn{"rotate 180", 180, 0, TJXOP_ROT180},
                        Turn{"mirror", 0, 1, TJXOP_HFLIP}}) {
    register_job({t.name, [=] { return turn(*source, size, t.angle, t.flip); },
                  [=](int) { return peer::transform(*source, t.operation, 0, nullptr); }});
  }
}

}  // namespace bench
