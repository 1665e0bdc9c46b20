// The last stage of a decode: one row of samples becomes one row of the caller's pixels.
#pragma once

#include <cstddef>
#include <cstdint>

#include "codec/pixel/row_stores.h"
#include "tavirpelo/api.h"

typedef struct PELOJ_JDINFO PELOJ_JDINFO;

namespace pelo::jpeg {

// Where and how rows are written. Rows are addressed from their number, so that no pointer is formed
// outside the buffer; none past `bandEnd` is written.
struct RowOutput {
  uint8_t* plane[3];    // first pixel; null writes nothing
  ptrdiff_t pixelStep;  // bytes between neighbours of a written row
  ptrdiff_t rowStep;    // bytes between written rows
  int planar;           // Y, Cb and Cr planes
  int dither;           // YCbCr sources only
  int emitted;          // rows delivered
  int limit;            // rows to deliver
  int firstRow;         // the row that the planes begin with
  int bandEnd;          // rows to deliver before the planes change; the whole picture's: limit
  PackRow pack;
};

// Sets the output position and the packer of the state's format, rotation and target size; `buffer`
// holds bufferWidth x bufferHeight pixels, or exactly the picture when the fitting is tight.
void set_output(PELOJ_JDINFO& jd, void* buffer, uint32_t option);

// Sends the next `rows` rows to planes of their own, unrotated and bufferWidth wide; formats of one
// plane use the first. A null plane writes nothing.
void set_band(PELOJ_JDINFO& jd, uint8_t* const* planes, int rows);

// One-row writers: `count` samples a row of each channel, one pixel each.
void write_ycc_row(RowOutput& output, const uint8_t* y, const uint8_t* cb, const uint8_t* cr, int count);
void write_grey_row(RowOutput& output, const uint8_t* y, int count);
void write_rgb_row(RowOutput& output, const uint8_t* r, const uint8_t* g, const uint8_t* b, int count);

// Of each output column the sample that `columns` names; `count` is the number of output columns.
void write_picked_row(RowOutput& output, const uint16_t* columns, const uint8_t* y, const uint8_t* cb,
                      const uint8_t* cr, int count);

// Accumulator writers: `count` packed sums of four samples (codec/pixel/quad_sampler.h).
void write_ycc_sums(RowOutput& output, const uint32_t* sums, int count);
void write_grey_sums(RowOutput& output, const uint32_t* sums, int count);
void write_rgb_sums(RowOutput& output, const uint32_t* sums, int count);

}  // namespace pelo::jpeg
