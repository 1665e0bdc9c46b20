// The given names of the zoom engine; each forwards to the room's own function.
#include "codec/base/errors.h"
#include "codec/zoom/zoom.h"

using namespace pelo;

int TAVIRPELO_ZoomRatio(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int ratio) {
  begin_operation();
  return zoom::zoom_ratio(decInfo, display, width, height, ratio, 0);
}

int TAVIRPELO_FastZoomRatio(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height,
                            int ratio) {
  begin_operation();
  return zoom::zoom_ratio(decInfo, display, width, height, ratio, 1);
}

int TAVIRPELO_PanPosition(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int x,
                          int y) {
  begin_operation();
  return zoom::pan(decInfo, display, width, height, x, y, 0);
}

int TAVIRPELO_FastPanPosition(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int x,
                              int y) {
  begin_operation();
  return zoom::pan(decInfo, display, width, height, x, y, 1);
}

int TAVIRPELO_ControlZoom(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height,
                          int control) {
  begin_operation();
  return zoom::control(decInfo, display, width, height, control);
}

int PELO_ZoomRatioEx(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int ratio,
                     int fast) {
  return zoom::zoom_ratio(decInfo, display, width, height, ratio, fast);
}

int PELO_PanPositionEx(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int x, int y,
                       int fast) {
  return zoom::pan(decInfo, display, width, height, x, y, fast);
}

int TAVIRPELO_JumpZoom(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height,
                       const int target[3]) {
  begin_operation();
  return zoom::jump_to(decInfo, display, width, height, target);
}

int TAVIRPELO_SetDisplayOnPosition(TAVIRPELO_DECINFO* decInfo, void* display, int arg2, int width,
                                   int height, int dx, int dy) {
  begin_operation();
  return zoom::shift_display(decInfo, display, arg2, width, height, dx, dy);
}

int TAVIRPELO_SetMapOnPosition(TAVIRPELO_DECINFO* decInfo, void* display, const int mapSize[2],
                               int width, int height, int x, int y) {
  begin_operation();
  return zoom::centre_on_map(decInfo, display, mapSize, width, height, x, y);
}

int PELO_MakeDisplay(const TAVIRPELO_ZOOMINFO* zoom, void* display, int width, int height, int fast) {
  return zoom::make_display(zoom, display, width, height, fast);
}

int PELO_MakeRGB888Display(const TAVIRPELO_ZOOMINFO* zoom, void* display, int width, int height) {
  return zoom::make_rgb888_display(zoom, display, width, height);
}

void PELO_SetOutBuff(void* display, int width, int height, uint32_t colour) {
  zoom::fill565(display, width, height, colour);
}

void PELO_SetRGB888OutBuff(void* display, int width, int height, uint32_t colour) {
  zoom::fill888(display, width, height, colour);
}

void PELO_CheckInvalidSize(TAVIRPELO_ZOOMINFO* zoom) {
  zoom::raise_empty_sides(zoom);
}

int TAVIRPELO_GetMapOnArea(TAVIRPELO_DECINFO* decInfo, int mapWidth, int mapHeight, int area[6]) {
  begin_operation();
  return zoom::map_area(decInfo, mapWidth, mapHeight, area);
}

int TAVIRPELO_GetZoomStatus(TAVIRPELO_DECINFO* decInfo, int* x, int* y, int* ratio) {
  begin_operation();
  return zoom::status(decInfo, x, y, ratio);
}

int TAVIRPELO_GetMaxZoomLevel(TAVIRPELO_DECINFO* decInfo, int* level) {
  begin_operation();
  return zoom::top_level(decInfo, level);
}

int TAVIRPELO_GetMaxZoomRatio(TAVIRPELO_DECINFO* decInfo, int* ratio) {
  begin_operation();
  return zoom::top_ratio(decInfo, ratio);
}

void* TAVIRPELO_GetZoomBuffer(TAVIRPELO_DECINFO* decInfo) {
  begin_operation();
  return zoom::buffer(decInfo);
}

int TAVIRPELO_SetZoomScale(TAVIRPELO_DECINFO* decInfo, int scale) {
  begin_operation();
  return zoom::set_scale(decInfo, scale);
}

int TAVIRPELO_GetZoomMemRequirement(TAVIRPELO_DECINFO* decInfo, int displayWidth, int arg2) {
  begin_operation();
  return zoom::needed_memory(decInfo, displayWidth, arg2);
}

int TAVIRPELO_RefreshZoom(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height) {
  begin_operation();
  return zoom::refresh(decInfo, display, width, height);
}

int TAVIRPELO_StopZoom(TAVIRPELO_DECINFO* decInfo) {
  begin_operation();
  return zoom::stop(decInfo);
}

int PELO_InitZoom(TAVIRPELO_DECINFO* decInfo, int displayWidth, int displayHeight, int budget,
                  int zoomFactor, int withZoomedImage) {
  return zoom::init(decInfo, displayWidth, displayHeight, budget, zoomFactor, withZoomedImage);
}

int TAVIRPELO_StartZoom(TAVIRPELO_DECINFO* decInfo, const void* preview, int previewWidth,
                        int previewHeight, void* display, int displayWidth, int displayHeight,
                        uint32_t background, int budget, int zoomFactor, int taskPriority) {
  begin_operation();
  return zoom::start(decInfo, preview, previewWidth, previewHeight, display, displayWidth, displayHeight,
                     background, budget, zoomFactor, taskPriority);
}

int TAVIRPELO_StartZoomWithZoomImage(TAVIRPELO_DECINFO* decInfo, const void* preview, int previewWidth,
                                     int previewHeight, void* display, int displayWidth,
                                     int displayHeight, uint32_t background, int budget, int zoomFactor,
                                     int taskPriority) {
  begin_operation();
  return zoom::start_with_image(decInfo, preview, previewWidth, previewHeight, display, displayWidth,
                                displayHeight, background, budget, zoomFactor, taskPriority);
}

void PELO_AsyncDecodeJPEG() {
  zoom::run_task();
}

int TAVIRPELO_CreateTask(int arg0, TAVIRPELO_TASKFN arg1) {
  return zoom::create_task(arg0, arg1);
}

int TAVIRPELO_StartTask(int arg0) {
  return zoom::start_task(arg0);
}

int TAVIRPELO_SendMessage(int arg0, const TAVIRPELO_TASKMESSAGE* arg1) {
  return zoom::send_message(arg0, arg1);
}

int TAVIRPELO_ReceiveMessage(int arg0, TAVIRPELO_TASKMESSAGE* arg1) {
  return zoom::receive_message(arg0, arg1);
}

int TAVIRPELO_DestroyTask(int arg0) {
  return zoom::destroy_task(arg0);
}

int TAVIRPELO_MakeZoomImageLowQuality(TAVIRPELO_DECINFO* decInfo) {
  begin_operation();
  return zoom::render_low(decInfo);
}

int TAVIRPELO_MakeZoomImageMediumQuality(TAVIRPELO_DECINFO* decInfo) {
  begin_operation();
  return zoom::render_medium(decInfo);
}

int TAVIRPELO_MakeZoomImageHighQuality(TAVIRPELO_DECINFO* decInfo) {
  begin_operation();
  return zoom::render_high(decInfo);
}

int TAVIRPELO_PanWithZoomImage(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int x,
                               int y) {
  begin_operation();
  return zoom::pan_rendered(decInfo, display, width, height, x, y);
}
