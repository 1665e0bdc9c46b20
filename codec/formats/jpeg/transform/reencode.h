// Fitting a JPEG into a number of bytes: coarser quantisation first, then a smaller picture.
#pragma once

#include "tavirpelo/transform.h"

// The scale (1024 = 1.0) at which a picture of width x height pixels is estimated to take `target`
// bytes.
TAVIRPELO_API int __elo_get_outimage_scale_ratio(int width, int height, int target);

// Decodes a source to width x height and encodes it at quality 50 behind the APP1 segment. 1, or 0 when
// it cannot be decoded so or memory is short.
TAVIRPELO_API int __elo_resize_jpeg_image(void* source, int size, int kind, int width, int height,
                                          const TAVIRPELO_APP1* app1, ELO_DESTINATION* destination);

// Encodes the source within `target` bytes to a memory destination, or to a file one whose file is open.
// 1 or 0; the destination's buffer stays the caller's.
TAVIRPELO_API int __elo_bits_contol_encode(void* source, int size, int kind,
                                           ELO_DESTINATION* destination, int target);
