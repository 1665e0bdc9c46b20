// What the operations on a zoom have in common: finding the state, the caller's display, and the
// messages.
#pragma once

#include "codec/base/errors.h"
#include "codec/base/geometry.h"
#include "tavirpelo/zoom.h"

namespace pelo::zoom {

// Answers 0 with the decoding word set.
inline int fail(int code) {
  record_error(ErrorWord::kDecoding, code);
  return 0;
}

// Hands a text to the message hook; 0. Without a code the word keeps what a function below left in it.
inline int fail(const char* message) {
  TAVIRPELO_PrintMessage(message);
  return 0;
}
inline int fail(const char* message, int code) {
  fail(message);
  return fail(code);
}

// The messages of a group of operations.
struct Messages {
  const char* noObject;
  const char* noZoom;
};
constexpr Messages kControlMessages{"TAVIRPELO_ControlZoom : TAVIRPELO_DECINFO is null!",
                                    "TAVIRPELO_ControlZoom : TAVIRPELO_ZOOMINFO is null!"};
constexpr Messages kRatioMessages{"TAVIRPELO_ZoomRatio : TAVIRPELO_DECINFO is null!",
                                  "TAVIRPELO_ZoomRatio : TAVIRPELO_ZOOMINFO is null!"};
constexpr Messages kJumpMessages{"TAVIRPELO_JumpZoom : TAVIRPELO_DECINFO is null!",
                                 "TAVIRPELO_JumpZoom : TAVIRPELO_ZOOMINFO is null!"};
constexpr Messages kRefreshMessages{"TAVIRPELO_RefreshZoom : TAVIRPELO_DECINFO is null!",
                                    "TAVIRPELO_RefreshZoom : TAVIRPELO_ZOOMINFO is null!"};

// Begins an operation: clears gTAVIRPELO_Error, then the object's zoom, or null with error 1.
TAVIRPELO_ZOOMINFO* begin(TAVIRPELO_DECINFO* decInfo, const Messages& messages);

// The pixel formats that can be zoomed.
constexpr bool zoomable(int outFormat) {
  return outFormat == TAVIRPELO_RGB565 || outFormat == TAVIRPELO_RGB888;
}

// The picture's size from its header, before any rotation.
bool read_size(TAVIRPELO_DECINFO& decInfo, Size& picture);

// The caller's display buffer.
struct Display {
  void* pixels;
  Size size;

  bool usable() const { return pixels != nullptr && size.width > 0 && size.height > 0; }
};

// Ends the decode task, if any, and waits for it.
void end_task(TAVIRPELO_ZOOMINFO& zoom);

// Frees the object's zoom state and both buffers, if any, and clears pZoomInfo.
void release_state(TAVIRPELO_DECINFO& decInfo);

// Ends a zoom: the state goes, the object gets its own option word and progress function back.
void end_zoom(TAVIRPELO_DECINFO& decInfo);

}  // namespace pelo::zoom
