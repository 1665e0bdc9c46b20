// Redrawing while a task decodes: the caller polls.
#include "codec/zoom/draw.h"
#include "codec/zoom/session.h"
#include "codec/zoom/task.h"
#include "codec/zoom/zoom.h"

namespace pelo::zoom {
namespace {

// One polling state serves every zoom of the process.
enum class Refresh { kDone = 0, kLastDraw = 1, kDrawing = 2, kWaiting = 3 };
Refresh refreshState = Refresh::kWaiting;

// Before the first redraw: waits until the task has begun.
void wait_for_decode(TAVIRPELO_ZOOMINFO& zoom) {
  taskLayer.sleep(kPollInterval);
  const int32_t decode = load_shared(zoom.decodeState);
  if (decode == TAVIRPELO_ZOOM_DECODING) refreshState = Refresh::kDrawing;
  if (decode == TAVIRPELO_ZOOM_DECODED) refreshState = Refresh::kLastDraw;
}

}  // namespace

int refresh(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height) {
  TAVIRPELO_ZOOMINFO* zoom = begin(decInfo, kRefreshMessages);
  if (zoom == nullptr) return 0;
  const Display target{display, {width, height}};
  if (!target.usable()) return fail(TAVIRPELO_ERROR_NULL);
  if (refreshState == Refresh::kDone) {
    refreshState = Refresh::kWaiting;
    return 0;
  }
  if (refreshState == Refresh::kWaiting) {
    wait_for_decode(*zoom);
    return 1;
  }
  draw(*zoom, target);
  if (refreshState == Refresh::kLastDraw) {
    refreshState = Refresh::kDone;
  } else if (load_shared(zoom->decodeState) == TAVIRPELO_ZOOM_DECODED) {
    refreshState = Refresh::kLastDraw;  // what was drawn may still be from before
  }
  return 1;
}

}  // namespace pelo::zoom
