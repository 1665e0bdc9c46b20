// The decode driver: set-up of a decode and its row loop.
#pragma once

#include "codec/base/os_memory.h"
#include "codec/formats/jpeg/decoder/jd_info.h"

// What a decode is asked for, and what it learned.
typedef struct PELOJ_REQUEST {
  void* outBuffer;
  int width, height;            // requested
  int imageWidth, imageHeight;  // results
  int componentCount;
} PELOJ_REQUEST;

// Parses the headers, chooses sizes and scale and prepares the first scan. The state is the caller's: end
// it with PELOJ_DeleteDecoderInfo and TAVIRPELO_OsFree (or pelo::jpeg::Decoder). Null on failure.
TAVIRPELO_API PELOJ_JDINFO* PELOJ_Initialize(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source,
                                             PELOJ_REQUEST* request);

// Chooses the converter, lays out the components, prepares upsampler and scan. 200 or 201.
TAVIRPELO_API int PELOJ_StartDecompression(PELOJ_JDINFO* jdInfo);

// Decodes a picture from the source's position. 200; 201; 0 when the data ends before the first wanted
// row.
TAVIRPELO_API int PELOJ_DecodeImage(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source,
                                    PELOJ_REQUEST* request);

// The same for a caller's buffer; 1 or 0.
TAVIRPELO_API int PELOJ_ValorenDecodeFrame(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source,
                                           void* outBuffer, int reqWidth, int reqHeight);

namespace pelo::jpeg {

// Owns a decoder state.
using Decoder = OsPtr<PELOJ_JDINFO>;

}  // namespace pelo::jpeg
