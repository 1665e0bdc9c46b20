// The JPEG encoder's state and steps: one pass, baseline, Annex K tables, chroma 4:2:0 or grey.
#pragma once

#include <array>
#include <cstdint>

#include "codec/core/ground/os_memory.h"
#include "codec/jpeg/tables.h"
#include "tavirpelo/encode.h"

// Where the stream goes. Memory output owns the caller's buffer until the end; file output a working
// buffer that is flushed.
typedef struct ELO_DESTINATION {
  int toMemory;
  int capacity;     // bytes of the working buffer
  int used;
  int64_t total;    // bytes flushed before those
  FILE* file;
  uint8_t* buffer;
} ELO_DESTINATION;

// Coding parameters taken from a source picture instead of a quality; none are known yet.
typedef struct ELO_ENCPARAMETERS ELO_ENCPARAMETERS;

namespace pelo::jpeg {

// Codes of elo_SetError.
enum EncodeError { kNoMemory = 3, kBadFormat = 6, kBadSampling = 7, kBadSize = 14 };

constexpr int kEncoderMaxSide = 4999;
constexpr int kEncoderMaxBlocks = 10;

struct EncoderQuant {
  std::array<uint8_t, 64> value;       // natural order
  std::array<int32_t, 64> reciprocal;  // 65536 / (value x scale factor / 2048), 0 for no divisor
};

struct EncoderComponent {
  int id, h, v, table;
  int width, height;          // samples
  int blocksWide, blocksHigh;
  int stride;                 // samples of a buffered row: whole MCUs
  OsBuffer<uint8_t> samples;  // one MCU row
};

// Code and length by symbol; length 0 for symbols outside the table.
struct CodeTable {
  std::array<uint16_t, 256> code;
  std::array<uint8_t, 256> length;
};

}  // namespace pelo::jpeg

typedef struct ELO_ENCODER {
  int width, height, format, quality;
  int componentCount;
  int hMax, vMax;
  int mcusWide, mcusHigh, mcuBlocks;
  int mcuRow;
  std::array<pelo::jpeg::EncoderComponent, 3> components;
  std::array<pelo::jpeg::EncoderQuant, 2> quant;
  std::array<const pelo::jpeg::HuffmanSpec*, 2> dcSpec, acSpec;
  std::array<pelo::jpeg::CodeTable, 2> dc, ac;
  uint64_t bits;              // pending bits, the lowest bitCount ones
  int bitCount;
  std::array<int, 3> lastDc;
  ELO_DESTINATION* destination;
  const TAVIRPELO_APP1* app1;
  int failed;                 // the destination ran out
} ELO_ENCODER;

// ---- state (encoder.cpp) ----
TAVIRPELO_API void elo_SetError(int code);
TAVIRPELO_API ELO_ENCODER* __elo_jpeg_enc_initiaize(const TAVIRPELO_RAWINFO* image,
                                                    ELO_DESTINATION* destination,
                                                    const TAVIRPELO_ENCOPTION* options,
                                                    const ELO_ENCPARAMETERS* parameters);
// Frees what the state owns and the state. Null is ignored.
TAVIRPELO_API void __elo_jpeg_enc_release_mem(ELO_ENCODER* encoder);

// ---- tables (encoder_tables.cpp) ----
TAVIRPELO_API void __elo_jpeg_enc_set_quality(ELO_ENCODER* encoder, int quality);
TAVIRPELO_API void __elo_jpeg_enc_set_quant_table(ELO_ENCODER* encoder, int number, const uint8_t* values);
TAVIRPELO_API void __elo_jpeg_enc_prepare_huffman_code(ELO_ENCODER* encoder);
TAVIRPELO_API void __elo_jpeg_enc_prepare_derived_tbl(const pelo::jpeg::HuffmanSpec* spec,
                                                      pelo::jpeg::CodeTable* table);

// ---- destination (destination.cpp): 1, or 0 when it ran out ----
// Makes room for `bytes` more by growing or flushing.
TAVIRPELO_API int elo_jpeg_enc_reserve(ELO_ENCODER* encoder, int bytes);
// A copy of `old` with `extra` more bytes; `old` is released. Null, with `old` kept, when memory is short.
TAVIRPELO_API uint8_t* elo_jpeg_enc_realloc(uint8_t* old, int oldSize, int extra);

// ---- stream ----
TAVIRPELO_API int __elo_jpeg_enc_make_header(ELO_ENCODER* encoder);
TAVIRPELO_API int __elo_jpeg_enc_make_end_mark(ELO_ENCODER* encoder);
TAVIRPELO_API void __elo_jpeg_enc_write_bits(ELO_ENCODER* encoder, uint32_t code, int length);
TAVIRPELO_API int __elo_jpeg_enc_finish_compression(ELO_ENCODER* encoder);

// ---- picture ----
// Fills the sample buffers of the current MCU row from the image, or from planes that begin with it.
TAVIRPELO_API int __elo_jpeg_enc_process_image_data(ELO_ENCODER* encoder, const void* pixels);
TAVIRPELO_API void __elo_jpeg_enc_get_raw_data(ELO_ENCODER* encoder, const uint8_t* const* planes,
                                               int rowsAvailable);
// Codes the buffered MCU row and moves on to the next.
TAVIRPELO_API int __elo_jpeg_enc_compress_data(ELO_ENCODER* encoder);
TAVIRPELO_API void __elo_jpeg_enc_do_forward_dct(const pelo::jpeg::EncoderQuant* quant,
                                                 const uint8_t* samples, int stride, int32_t* block);
TAVIRPELO_API void __elo_jpeg_enc_encode_1mcu_blk(ELO_ENCODER* encoder, int component,
                                                  const int32_t* block);

// ---- band interface: planar 4:2:0 data, 16 rows a call ----
TAVIRPELO_API ELO_ENCODER* elo_jpeg_enc_mcu_init(const TAVIRPELO_RAWINFO* image,
                                                 ELO_DESTINATION* destination,
                                                 const TAVIRPELO_ENCOPTION* options,
                                                 const ELO_ENCPARAMETERS* parameters);
TAVIRPELO_API int elo_jpeg_enc_muc_process(ELO_ENCODER* encoder, const uint8_t* band, int* position);
// Writes EOI, reports buffer and total size (either pointer may be null), releases the state.
TAVIRPELO_API int elo_jpeg_enc_mcu_finish(ELO_ENCODER* encoder, uint8_t** buffer, int* size);
