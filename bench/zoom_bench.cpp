// Zooming over the photograph on a small display: the first view against libjpeg-turbo and a reduction,
// the next ones against libswscale on the same part of the zoom image.
#include <memory>

#include "bench/ours.h"
#include "bench/picture_peer.h"

namespace bench {
namespace {

constexpr peer::Size kDisplay{640, 480};
constexpr int kBudget = 16 << 20, kLargeBudget = 192 << 20;
constexpr int kFormat = TAVIRPELO_RGB888;

// An object with its display; the zoom starts on demand.
struct Zoom {
  explicit Zoom(const Bytes& photograph) : info(open(photograph, kFormat, TAVIRPELO_THUMBNAIL_NEVER)) {}
  ~Zoom() { TAVIRPELO_DestroyDecInfo(info); }
  Zoom(const Zoom&) = delete;
  Zoom& operator=(const Zoom&) = delete;

  bool start(int budget, int factor) {
    return TAVIRPELO_StartZoom(info, nullptr, 0, 0, display.data(), kDisplay.width, kDisplay.height, 0,
                               budget, factor, -1) == 1;
  }
  bool ratio(int percent) {
    return TAVIRPELO_ZoomRatio(info, display.data(), kDisplay.width, kDisplay.height, percent) == 1;
  }
  bool pan(int x, int y) {
    return TAVIRPELO_PanPosition(info, display.data(), kDisplay.width, kDisplay.height, x, y) == 1;
  }

  TAVIRPELO_DECINFO* info;
  Bytes display = Bytes(kDisplay.pixels() * 3);
};

void register_first_view(const Bytes& photograph) {
  register_job({"zoom, first view of 12 MP",
                [&photograph] {
                  Zoom zoom(photograph);
                  return zoom.start(kBudget, 1) && TAVIRPELO_StopZoom(zoom.info) == 1;
                },
                [&photograph](int flags) {
                  const peer::Size scaled = peer::scale_at_least(peer::size_of(photograph), 2300);
                  Bytes image(scaled.pixels() * 3);
                  Bytes display(kDisplay.pixels() * 3);
                  if (!peer::decode(photograph, scaled, TJPF_RGB, flags, image.data())) return false;
                  peer::reduce(image.data(), scaled, display.data(), kDisplay);
                  return true;
                }});
}

// A view at a ratio in percent, drawn anew by every call.
void register_view(const char* name, const Bytes& photograph, int budget, int factor, int percent) {
  const auto zoom = std::make_shared<Zoom>(photograph);
  if (!zoom->start(budget, factor) || !zoom->ratio(percent)) return;
  const TAVIRPELO_ZOOMINFO& z = *zoom->info->pZoomInfo;
  const peer::Size part{z.imageWidth * kDisplay.width / z.zoomedWidth,
                        z.imageHeight * kDisplay.height / z.zoomedHeight};
  const auto sws = std::make_shared<peer::Scaler>(part, kDisplay, kFormat);
  register_job({name, [=] { return zoom->pan(50, 60); },
                [=](int flags) {
                  const TAVIRPELO_ZOOMINFO& now = *zoom->info->pZoomInfo;
                  return sws->scale(static_cast<const uint8_t*>(now.pZoomImage), now.imageWidth * 3,
                                    zoom->display.data(), flags);
                }});
}

}  // namespace

void register_zoom_jobs(const Bytes& photograph) {
  register_first_view(photograph);
  register_view("zoom, pan at 150 percent", photograph, kBudget, 1, 150);
  register_view("zoom, pan at twice the picture", photograph, kLargeBudget, 2, 10000);
}

}  // namespace bench
