/* The whole codec interface. */
#ifndef TAVIRPELO_TAVIRPELO_H
#define TAVIRPELO_TAVIRPELO_H

#include "tavirpelo/decinfo.h"
#include "tavirpelo/decode.h"
#include "tavirpelo/encode.h"
#include "tavirpelo/error.h"
#include "tavirpelo/exif.h"
#include "tavirpelo/io.h"
#include "tavirpelo/parse.h"
#include "tavirpelo/raw.h"
#include "tavirpelo/transform.h"
#include "tavirpelo/yuv.h"
#include "tavirpelo/zoom.h"

#endif
