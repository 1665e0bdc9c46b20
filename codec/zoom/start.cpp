// Starting a zoom: state and buffers, then the first view from a decode or from the caller's preview.
#include <algorithm>

#include "codec/base/checked.h"
#include "codec/base/dec_info.h"
#include "codec/base/errors.h"
#include "codec/base/os_memory.h"
#include "codec/formats/jpeg/decoder/driver.h"
#include "codec/pixel/row_stores.h"
#include "codec/zoom/draw.h"
#include "codec/zoom/layout.h"
#include "codec/zoom/session.h"
#include "codec/zoom/task.h"
#include "codec/zoom/zoom.h"
#include "tavirpelo/decode.h"

namespace pelo::zoom {

static_assert(sizeof(void*) != 4 || sizeof(TAVIRPELO_ZOOMINFO) == 30 * 4);
static_assert(sizeof(void*) != 4 || offsetof(TAVIRPELO_ZOOMINFO, pZoomImage) == 19 * 4);
static_assert(sizeof(void*) != 4 || offsetof(TAVIRPELO_ZOOMINFO, stopRequest) == 26 * 4);

namespace {

// Zeroed: a decode may leave a border of a pixel.
bool allocate(OsBuffer<uint8_t>& buffer, Size size, int bytes) {
  const auto pixels = checked_mul(static_cast<size_t>(size.width), static_cast<size_t>(size.height));
  const auto total = pixels ? checked_mul(*pixels, static_cast<size_t>(bytes)) : pixels;
  return total && buffer.allocate(*total);
}

struct Wishes {
  Size display;
  int64_t budget;
  int zoomFactor;
  bool withZoomedImage;
};

// Attaches a complete state to the object, or changes only its option word and sets an error.
int attach(TAVIRPELO_DECINFO& decInfo, const Wishes& wishes) {
  Size picture;
  if (!read_size(decInfo, picture)) return fail("PELO_InitZoom : PELOJ_GetHInfo fail!");
  decInfo.option = zoom_rotation(decInfo.option, picture, wishes.display);

  auto zoom = os_new<TAVIRPELO_ZOOMINFO>();
  OsBuffer<uint8_t> image, zoomed;
  const int bytes = bytes_per_pixel(decInfo.outFormat);
  if (!zoom ||
      !lay_out(*zoom, turned(picture, decInfo.option), wishes.display, wishes.budget, wishes.zoomFactor,
               bytes) ||
      !allocate(image, {zoom->imageWidth, zoom->imageHeight}, bytes) ||
      (wishes.withZoomedImage && !allocate(zoomed, largest_zoomed(*zoom), bytes))) {
    return fail("PELO_InitZoom : malloc fail!", TAVIRPELO_ERROR_MEMORY);
  }
  zoom->format = decInfo.outFormat;
  zoom->taskId = -1;
  zoom->pZoomImage = image.release();
  zoom->pZoomedImage = zoomed.release();
  set_zoom_release(release_state);
  decInfo.pZoomInfo = zoom.release();
  return 1;
}

// ---- the first view ----

struct Preview {
  const void* pixels;
  Size size;

  bool usable() const { return pixels != nullptr && size.width > 0 && size.height > 0; }
};

// The picture's size as a decode with the caller's own options shows it.
Size size_for_caller(const TAVIRPELO_DECINFO& decInfo) {
  const TAVIRPELO_ZOOMINFO& zoom = *decInfo.pZoomInfo;
  return turned(turned({zoom.sourceWidth, zoom.sourceHeight}, decInfo.option), decInfo.userOption);
}

// Until the decode is done the preview stands in for the zoom image.
void show_preview(TAVIRPELO_DECINFO& decInfo, const Preview& preview) {
  TAVIRPELO_ZOOMINFO& zoom = *decInfo.pZoomInfo;
  const Size part = fit_floor(size_for_caller(decInfo), preview.size);
  const ptrdiff_t x = (preview.size.width - part.width) / 2;
  const ptrdiff_t y = (preview.size.height - part.height) / 2;
  const auto* first = static_cast<const uint8_t*>(preview.pixels) +
                      (y * preview.size.width + x) * bytes_per_pixel(zoom.format);
  scale_to({first, part, preview.size.width}, zoom.pZoomImage, {zoom.imageWidth, zoom.imageHeight},
           zoom.imageWidth, zoom.format, Quality::kAverage);
}

// The preview is in place before the task may write over it.
void decode_later(TAVIRPELO_DECINFO& decInfo, const Preview& preview, int priority) {
  TAVIRPELO_ZOOMINFO& zoom = *decInfo.pZoomInfo;
  show_preview(decInfo, preview);
  zoom.taskId = taskLayer.create(priority, PELO_AsyncDecodeJPEG);
  if (zoom.taskId < 0) return;
  taskLayer.start(zoom.taskId);
  const TAVIRPELO_TASKMESSAGE message{&decInfo, zoom.pZoomImage, zoom.imageWidth, zoom.imageHeight,
                                      zoom.previewFlag};
  taskLayer.send(zoom.taskId, &message);
}

bool decode_now(TAVIRPELO_DECINFO& decInfo) {
  TAVIRPELO_ZOOMINFO& zoom = *decInfo.pZoomInfo;
  if (jpeg::decode(&decInfo, zoom.pZoomImage, zoom.imageWidth, zoom.imageHeight) != 1) {
    return false;
  }
  store_shared(zoom.decodeState, TAVIRPELO_ZOOM_DECODED);
  return true;
}

struct Start {
  Preview preview;
  Display display;
  uint32_t background;
  int budget, zoomFactor, priority;
};

int start_zoom(TAVIRPELO_DECINFO* decInfo, const Start& start, bool withZoomedImage) {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
  if (decInfo != nullptr && !start.display.usable()) return fail(TAVIRPELO_ERROR_NULL);
  const Size display = start.display.size;
  if (!init(decInfo, display.width, display.height, start.budget, start.zoomFactor, withZoomedImage)) {
    return fail("TAVIRPELO_StartZoom : PELO_InitZoom Fail");
  }
  TAVIRPELO_ZOOMINFO& zoom = *decInfo->pZoomInfo;
  const Size picture = size_for_caller(*decInfo);
  zoom.background = start.background;
  zoom.previewFlag =
      picture.width <= start.preview.size.width && picture.height <= start.preview.size.height;

  if (start.preview.usable() && start.priority >= 0) {
    decode_later(*decInfo, start.preview, start.priority);
  } else if (!decode_now(*decInfo)) {
    end_zoom(*decInfo);
    return fail("TAVIRPELO_StartZoom : TAVIRPELO_DecodeJPEG Fail");
  }
  draw(zoom, start.display);
  return 1;
}

}  // namespace

int init(TAVIRPELO_DECINFO* decInfo, int displayWidth, int displayHeight, int budget, int zoomFactor,
         int withZoomedImage) {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
  if (decInfo == nullptr) {
    return fail("PELO_InitZoom : TAVIRPELO_DECINFO is null!", TAVIRPELO_ERROR_NULL);
  }
  if (!zoomable(decInfo->outFormat)) return 0;
  if (decInfo->pZoomInfo != nullptr) {
    return fail("PELO_InitZoom : Have Other Zoom info!", TAVIRPELO_ERROR_ZOOM_PRESENT);
  }
  decInfo->CheckFn = TAVIRPELO_ZoomCheckFn;
  const Size display{std::max(0, displayWidth), std::max(0, displayHeight)};
  if (attach(*decInfo, {display, budget, zoomFactor, withZoomedImage != 0})) return 1;
  end_zoom(*decInfo);
  return 0;
}

int start(TAVIRPELO_DECINFO* decInfo, const void* preview, int previewWidth, int previewHeight,
          void* display, int displayWidth, int displayHeight, uint32_t background, int budget,
          int zoomFactor, int taskPriority) {
  return start_zoom(decInfo,
                    {{preview, {previewWidth, previewHeight}},
                     {display, {displayWidth, displayHeight}},
                     background,
                     budget,
                     zoomFactor,
                     taskPriority},
                    false);
}

int start_with_image(TAVIRPELO_DECINFO* decInfo, const void* preview, int previewWidth,
                     int previewHeight, void* display, int displayWidth, int displayHeight,
                     uint32_t background, int budget, int zoomFactor, int taskPriority) {
  return start_zoom(decInfo,
                    {{preview, {previewWidth, previewHeight}},
                     {display, {displayWidth, displayHeight}},
                     background,
                     budget / 2,
                     zoomFactor,
                     taskPriority},
                    true);
}

}  // namespace pelo::zoom
