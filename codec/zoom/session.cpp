// Finding an object's picture and zoom, and ending the zoom.
#include "codec/zoom/session.h"

#include "codec/base/errors.h"
#include "codec/base/os.h"
#include "codec/formats/jpeg/header_scan.h"
#include "codec/zoom/task.h"
#include "codec/zoom/zoom.h"

namespace pelo::zoom {

TAVIRPELO_ZOOMINFO* begin(TAVIRPELO_DECINFO* decInfo, const Messages& messages) {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
  const bool missing = decInfo == nullptr;
  if (missing || decInfo->pZoomInfo == nullptr) {
    fail(missing ? messages.noObject : messages.noZoom, TAVIRPELO_ERROR_NULL);
    return nullptr;
  }
  return decInfo->pZoomInfo;
}

bool read_size(TAVIRPELO_DECINFO& decInfo, Size& picture) {
  TAVIRPELO_HINFO header{};
  if (jpeg::header_info(decInfo.pIO, &header) != 1) return false;
  picture = {header.width, header.height};
  return picture.width > 0 && picture.height > 0;
}

void end_task(TAVIRPELO_ZOOMINFO& zoom) {
  store_shared(zoom.stopRequest, 1);
  if (zoom.taskId < 0) return;
  while (load_shared(zoom.decodeState) != TAVIRPELO_ZOOM_DECODED) taskLayer.sleep(kPollInterval);
  taskLayer.destroy(zoom.taskId);
  zoom.taskId = -1;
}

void release_state(TAVIRPELO_DECINFO& decInfo) {
  TAVIRPELO_ZOOMINFO* zoom = decInfo.pZoomInfo;
  if (zoom == nullptr) return;
  end_task(*zoom);
  os_free(zoom->pZoomImage);
  os_free(zoom->pZoomedImage);
  os_free(zoom);
  decInfo.pZoomInfo = nullptr;
}

void end_zoom(TAVIRPELO_DECINFO& decInfo) {
  release_state(decInfo);
  decInfo.option = decInfo.userOption;
  decInfo.CheckFn = TAVIRPELO_CheckFn;
}

int stop(TAVIRPELO_DECINFO* decInfo) {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
  if (decInfo == nullptr) {
    return pelo::zoom::fail("TAVIRPELO_StopZoom : TAVIRPELO_DECINFO is null!", TAVIRPELO_ERROR_NULL);
  }
  if (decInfo->pZoomInfo == nullptr) return pelo::zoom::fail(TAVIRPELO_ERROR_NULL);
  pelo::zoom::end_zoom(*decInfo);
  return 1;
}

}  // namespace pelo::zoom
