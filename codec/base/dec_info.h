// The decoder information object, behind the given names of tavirpelo/decinfo.h, and what it leaves to
// the rooms above it.
#pragma once

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

}  // namespace pelo
