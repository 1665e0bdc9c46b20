// The state of one JPEG encoding, its steps in calling order, and the band interface.
//
// How to read this room: initialise makes the state, headers writes what stands before the data. For
// each MCU row input_rows turns pixels into samples, mcu_row walks over its blocks, forward_dct
// transforms and quantises one, block_coder codes an MCU through bit_writer into the destination. bands
// feeds the rows from outside, encode_jpeg whole images.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "codec/base/os_memory.h"
#include "codec/formats/jpeg/encoder/bit_writer.h"
#include "codec/formats/jpeg/encoder/coding_tables.h"
#include "codec/formats/jpeg/encoder/destination.h"
#include "codec/formats/jpeg/tables.h"
#include "tavirpelo/encode.h"

namespace pelo::jpeg {

constexpr int kEncoderComponents = 3;
constexpr int kQuantTables = 4;
constexpr int kEncoderMcuBlocks = 10;  // T.81 B.2.3
constexpr int kMaxEncodedSide = 4999;

// Quantised coefficients in natural order.
using CoefficientBlock = std::array<int32_t, 64>;

// Coding parameters taken from another JPEG instead of a quality.
struct CodingParameters {
  struct Component {
    uint8_t quantTable;  // 0 to 3
    uint8_t h, v;        // sampling factors, 1 or 2
  };
  int componentCount;
  std::array<Component, kEncoderComponents> components;
  std::array<std::array<uint8_t, 64>, kQuantTables> quant;  // by table number, natural order
  bool restartPerRow;  // announce a restart interval of one MCU row; the caller writes the markers
};

struct EncoderComponent {
  uint8_t id;
  uint8_t h, v;  // sampling factors
  uint8_t quantTable, dcTable, acTable;
  int blocksWide, blocksHigh;
  int width, height;          // samples
  OsBuffer<uint8_t> samples;  // one MCU row: 8 * v rows of 8 * blocksWide

  int stride() const { return 8 * blocksWide; }
  uint8_t* row(int y) { return samples.data() + static_cast<ptrdiff_t>(y) * stride(); }
};

// What the entropy coder carries from one MCU to the next. Copyable: a caller that codes several streams
// in turn keeps one for each.
struct EntropyCoderState {
  PendingBits pending;
  std::array<int32_t, kEncoderComponents> lastDc;
};

}  // namespace pelo::jpeg

struct ELO_ENCODER {
  int width, height;  // pixels
  uint32_t format;    // of the input image
  const uint8_t* pixels;
  int row;  // first pixel row of the next MCU row

  int componentCount;
  std::array<pelo::jpeg::EncoderComponent, pelo::jpeg::kEncoderComponents> components;
  int hMax, vMax;
  int mcusAcross, mcusDown;
  int mcuBlocks;
  std::array<uint8_t, pelo::jpeg::kEncoderMcuBlocks> blockComponent;  // of each block of an MCU
  bool restartPerRow;

  std::array<pelo::jpeg::QuantiseTable, pelo::jpeg::kQuantTables> quant;
  std::array<const pelo::jpeg::HuffmanSpec*, 2> dcSpecs, acSpecs;
  std::array<pelo::jpeg::HuffmanCodes, 2> dcCodes, acCodes;

  pelo::jpeg::EntropyCoderState entropy;
  ELO_DESTINATION* destination;  // the caller's
  const TAVIRPELO_APP1* app1;    // the caller's, or null

  int mcu_width() const { return 8 * hMax; }
  int mcu_height() const { return 8 * vMax; }
};

// ---- the steps ----

namespace pelo::jpeg {

// A new state for an image of these sides and format, writing to `destination`, which must outlive it.
// Without parameters: 4:2:0 (or grey) at the quality of the options. Null on failure.
ELO_ENCODER* make_encoder(const TAVIRPELO_RAWINFO* image, ELO_DESTINATION* destination,
                          const TAVIRPELO_ENCOPTION* options,
                          const pelo::jpeg::CodingParameters* parameters);

}  // namespace pelo::jpeg

// The steps below return 1, or 0 when the destination fails.

namespace pelo::jpeg {

// Everything before the entropy-coded data.
int write_headers(ELO_ENCODER* encoder);

// Encodes the next MCU row of the image.
int encode_next_row(ELO_ENCODER* encoder);

// Fills the sample buffers with the next MCU row of the encoder's image. False for a format that the
// component layout cannot take.
[[nodiscard]] bool read_input_rows(ELO_ENCODER& encoder);

// True when the components are those of planar input: one alone, or 4:2:0.
bool takes_planes(const ELO_ENCODER& encoder);

// Fills the sample rows of the next MCU row from planes that start at its first row and are packed
// (component width samples a row); columns and rows beyond the image repeat the last ones.
void take_planes(ELO_ENCODER* encoder, const uint8_t* const* planes);

// Transforms and codes the MCU row in the sample buffers, and moves on to the next.
int code_row(ELO_ENCODER* encoder);

// One block of 8 x 8 samples, `stride` bytes from row to row, to quantised coefficients.
void transform_and_quantise(const uint8_t* samples, ptrdiff_t stride,
                            const pelo::jpeg::QuantiseTable* table, int32_t* coefficients);

// Codes one MCU of encoder->mcuBlocks blocks. Values beyond what baseline codes can express (AC
// -1023..1023, DC -1024..1023) are clamped; zig-zag position 63 is never coded.
int code_mcu(ELO_ENCODER* encoder, const pelo::jpeg::CoefficientBlock* blocks);

// EOI, and the end of the destination.
int write_end_mark(ELO_ENCODER* encoder);

// Frees what the state holds, and a file destination's working buffer; the state itself stays.
void release_buffers(ELO_ENCODER* encoder);

}  // namespace pelo::jpeg

// ---- data that arrives in bands ----

namespace pelo::jpeg {

// Starts an encoding and writes the headers. The image's pixels are not read. Null on failure, with the
// destination still the caller's.
ELO_ENCODER* begin_bands(const TAVIRPELO_RAWINFO* image, ELO_DESTINATION* destination,
                         const TAVIRPELO_ENCOPTION* options,
                         const pelo::jpeg::CodingParameters* parameters);

// The next row of MCUs, from a planar 4:2:0 picture 16 rows high without gaps between its planes. What
// lies below the image in the last one is not read. *position, where it is given, becomes the number of
// image rows coded so far; 1 or 0.
int encode_band(ELO_ENCODER* encoder, const uint8_t* band, int* position);

// Ends the image, reports the working buffer and the bytes produced (either may be null), and frees the
// state. 1 or 0.
int finish_bands(ELO_ENCODER* encoder, uint8_t** buffer, int* size);

// ---- whole images ----

// As elo_enc_jpeg_to_buffer_ex and elo_enc_jpeg_to_file_ex (tavirpelo/encode.h).
int encode_to_buffer(const TAVIRPELO_RAWINFO* image, uint8_t** buffer, int* size,
                     const TAVIRPELO_ENCOPTION* options);
int encode_to_file(const TAVIRPELO_RAWINFO* image, const char* path, const TAVIRPELO_ENCOPTION* options);

}  // namespace pelo::jpeg
