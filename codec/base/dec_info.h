// The decoder information object, behind the given names of tavirpelo/decinfo.h, and what it leaves to
// the rooms above it; the caller's say between the rows of a decode.
#pragma once

#include "codec/base/errors.h"
#include "tavirpelo/decinfo.h"

namespace pelo {

// Frees an object's zoom state and clears pZoomInfo.
using ReleaseZoom = void (*)(TAVIRPELO_DECINFO&);

// The zoom engine says how its states are freed before it attaches one: an object that is destroyed
// while zooming takes its zoom with it.
void set_zoom_release(ReleaseZoom release);

TAVIRPELO_DECINFO* create_dec_info(int ioType, void* source, int size, int outFormat, uint32_t option);
TAVIRPELO_DECINFO* create_dec_info_with_stream(void* context, int size, TAVIRPELO_READFN pfRead,
                                               TAVIRPELO_SKIPFN pfSkip, TAVIRPELO_RESETFN pfReset,
                                               int outFormat, uint32_t option);
int destroy_dec_info(TAVIRPELO_DECINFO* decInfo);

int set_option(TAVIRPELO_DECINFO* decInfo, uint32_t option);
int set_mode(TAVIRPELO_DECINFO* decInfo, int mode);
int set_callback(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_PROGRESSFN function, intptr_t argument);
int object_error();
int decoder_version();

// Asks the object's CheckFn before more output rows are written; `finished` of them stand. False ends
// the decode. Nobody to ask is no objection.
inline bool caller_agrees(TAVIRPELO_DECINFO* decInfo, int finished) {
  if (decInfo == nullptr || decInfo->CheckFn == nullptr) return true;
  return decInfo->CheckFn(decInfo, finished, finished) != 0 ||
         refuse(Reason::kCancelled, "writing rows");
}

}  // namespace pelo
