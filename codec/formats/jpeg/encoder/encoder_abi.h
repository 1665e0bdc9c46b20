// Given names of this room that no public header has; each is what the room's own function says.
#pragma once

#include "codec/formats/jpeg/encoder/bit_writer.h"
#include "codec/formats/jpeg/encoder/coding_tables.h"
#include "codec/formats/jpeg/encoder/destination.h"
#include "codec/formats/jpeg/encoder/encoder.h"

// Writes the low `length` (0 to 16) bits of `code`; 1, or 0 when the destination cannot take them.
TAVIRPELO_API int __elo_jpeg_enc_write_bits(ELO_ENCODER* encoder, uint32_t code, int length);

// Ends the entropy-coded data: completes the last byte with 1-bits. Nothing pending: writes nothing.
TAVIRPELO_API int __elo_jpeg_enc_finish_compression(ELO_ENCODER* encoder);

// The block moved into one `extra` bytes larger; null, with the old block untouched, when memory is
// short or the new size exceeds an int.
TAVIRPELO_API uint8_t* elo_jpeg_enc_realloc(uint8_t* old, int oldSize, int extra);

// Takes the reason of a failure; keeps none.
TAVIRPELO_API void elo_SetError(int code);

// A new state for an image of these sides and format, writing to `destination`, which must outlive it.
// Without parameters: 4:2:0 (or grey) at the quality of the options. Null on failure.
TAVIRPELO_API ELO_ENCODER* __elo_jpeg_enc_initiaize(const TAVIRPELO_RAWINFO* image,
                                                    ELO_DESTINATION* destination,
                                                    const TAVIRPELO_ENCOPTION* options,
                                                    const pelo::jpeg::CodingParameters* parameters);

// Everything before the entropy-coded data.
TAVIRPELO_API int __elo_jpeg_enc_make_header(ELO_ENCODER* encoder);

// Encodes the next MCU row of the image.
TAVIRPELO_API int __elo_jpeg_enc_process_image_data(ELO_ENCODER* encoder);

// Fills the sample rows of the next MCU row from planes that start at its first row and are packed
// (component width samples a row); columns and rows beyond the image repeat the last ones.
TAVIRPELO_API void __elo_jpeg_enc_get_raw_data(ELO_ENCODER* encoder, const uint8_t* const* planes);

// Transforms and codes the MCU row in the sample buffers, and moves on to the next.
TAVIRPELO_API int __elo_jpeg_enc_compress_data(ELO_ENCODER* encoder);

// One block of 8 x 8 samples, `stride` bytes from row to row, to quantised coefficients.
TAVIRPELO_API void __elo_jpeg_enc_do_forward_dct(const uint8_t* samples, ptrdiff_t stride,
                                                 const pelo::jpeg::QuantiseTable* table,
                                                 int32_t* coefficients);

// Codes one MCU of encoder->mcuBlocks blocks. Values beyond what baseline codes can express (AC
// -1023..1023, DC -1024..1023) are clamped; zig-zag position 63 is never coded.
TAVIRPELO_API int __elo_jpeg_enc_encode_1mcu_blk(ELO_ENCODER* encoder,
                                                 const pelo::jpeg::CoefficientBlock* blocks);

// EOI, and the end of the destination.
TAVIRPELO_API int __elo_jpeg_enc_make_end_mark(ELO_ENCODER* encoder);

// Frees what the state holds, and a file destination's working buffer; the state itself stays.
TAVIRPELO_API void __elo_jpeg_enc_release_mem(ELO_ENCODER* encoder);

// Starts an encoding and writes the headers. The image's pixels are not read. Null on failure, with the
// destination still the caller's.
TAVIRPELO_API ELO_ENCODER* elo_jpeg_enc_mcu_init(const TAVIRPELO_RAWINFO* image,
                                                 ELO_DESTINATION* destination,
                                                 const TAVIRPELO_ENCOPTION* options,
                                                 const pelo::jpeg::CodingParameters* parameters);

// The next row of MCUs, from a planar 4:2:0 picture 16 rows high without gaps between its planes. What
// lies below the image in the last one is not read. *position, where it is given, becomes the number of
// image rows coded so far; 1 or 0.
TAVIRPELO_API int elo_jpeg_enc_muc_process(ELO_ENCODER* encoder, const uint8_t* band, int* position);

// Ends the image, reports the working buffer and the bytes produced (either may be null), and frees the
// state. 1 or 0.
TAVIRPELO_API int elo_jpeg_enc_mcu_finish(ELO_ENCODER* encoder, uint8_t** buffer, int* size);

// Installs the Annex K tables and derives their codes.
TAVIRPELO_API void __elo_jpeg_enc_prepare_huffman_code(ELO_ENCODER* encoder);

// Derives the codes of one table.
TAVIRPELO_API void __elo_jpeg_enc_prepare_derived_tbl(const pelo::jpeg::HuffmanSpec* spec,
                                                      pelo::jpeg::HuffmanCodes* codes);

// Installs tables 0 and 1 for a quality, clamped to 1..100: the Annex K tables scaled to
// 5000 / quality percent below 50, 200 - 2 * quality from there.
TAVIRPELO_API void __elo_jpeg_enc_set_quality(ELO_ENCODER* encoder, int quality);

// Installs the 64 values (natural order) of table `number` (0 to 3).
TAVIRPELO_API void __elo_jpeg_enc_set_quant_table(ELO_ENCODER* encoder, int number,
                                                  const uint8_t* values);
