// The decode driver: set-up of a decode and its row loop.
//
// How to read this room: decode_jpeg.cpp chooses between picture and thumbnail, driver.cpp sets a decode
// up and runs it, over the records of jd_info.h.
//   headers.h   markers parses them, decode_size chooses sizes and scale
//   scans.h     scan_setup lays a scan out and makes its tables (huffman), scan_list holds several
//   imcu_row.h  imcu_row decodes one iMCU row of samples: mcu_decode over bit_reader, then a transform
//   of
//               idct.h; of progressive pictures progressive does, over progressive_mcu
//   rows.h      rows shows that row by row: replicated to the full grid, then by convert at the target
//               size; row_output makes pixels of it
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

namespace pelo::jpeg {

// Parses the headers, chooses sizes and scale and prepares the first scan. The state is the caller's:
// end it with clear_decoder and TAVIRPELO_OsFree (or pelo::jpeg::Decoder). Null on failure.
PELOJ_JDINFO* initialize_decoder(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source,
                                 PELOJ_REQUEST* request);

// Chooses the converter, lays out the components, prepares upsampler and scan. 200 or 201.
int start_decompression(PELOJ_JDINFO* jdInfo);

// Decodes a picture from the source's position. 200; 201; 0 when the data ends before the first wanted
// row.
int decode_image(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source, PELOJ_REQUEST* request);

// The same for a caller's buffer; 1 or 0.
int decode_frame(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source, void* outBuffer, int reqWidth,
                 int reqHeight);

// Owns a decoder state.
using Decoder = OsPtr<PELOJ_JDINFO>;

// Behind the given names of the public headers, which say what they do.
int decode(TAVIRPELO_DECINFO* decInfo, void* outBuffer, int reqWidth, int reqHeight);
int decode_thumbnail(TAVIRPELO_DECINFO* decInfo, void* outBuffer, int reqWidth, int reqHeight,
                     int* outWidth, int* outHeight);
int produced_size(const TAVIRPELO_DECINFO* decInfo, int* width, int* height);
int rotate_buffer_90(void* buffer, int width, int height, int outFormat);
int rotate_buffer_270(void* buffer, int width, int height, int outFormat);

}  // namespace pelo::jpeg
