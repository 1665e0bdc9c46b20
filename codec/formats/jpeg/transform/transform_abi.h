// Given names of this room that no public header has; each is what the room's own function says.
#pragma once

#include "codec/formats/jpeg/transform/block_transform.h"
#include "codec/formats/jpeg/transform/coding_parameters.h"
#include "codec/formats/jpeg/transform/coefficient_source.h"
#include "codec/formats/jpeg/transform/stream_encoder.h"
#include "codec/formats/jpeg/transform/transform.h"

// One block; `in` and `out` are different. ro90_f and ro270_f are the turns with mirroring.
TAVIRPELO_API void __elo_flip_h(const pelo::jpeg::CoefficientBlock* in,
                                pelo::jpeg::CoefficientBlock* out);
TAVIRPELO_API void __elo_flip_v(const pelo::jpeg::CoefficientBlock* in,
                                pelo::jpeg::CoefficientBlock* out);
TAVIRPELO_API void __elo_rotate_90(const pelo::jpeg::CoefficientBlock* in,
                                   pelo::jpeg::CoefficientBlock* out);
TAVIRPELO_API void __elo_rotate_180(const pelo::jpeg::CoefficientBlock* in,
                                    pelo::jpeg::CoefficientBlock* out);
TAVIRPELO_API void __elo_rotate_270(const pelo::jpeg::CoefficientBlock* in,
                                    pelo::jpeg::CoefficientBlock* out);
TAVIRPELO_API void __elo_ro90_f(const pelo::jpeg::CoefficientBlock* in,
                                pelo::jpeg::CoefficientBlock* out);
TAVIRPELO_API void __elo_ro270_f(const pelo::jpeg::CoefficientBlock* in,
                                 pelo::jpeg::CoefficientBlock* out);

// Takes components, sampling factors and each distinct quantisation table of the source; ratios are 1.
TAVIRPELO_API void __elo_jpeg_adv_set_enc_info_from_dec_info(
    pelo::jpeg::CoefficientSource* source, pelo::jpeg::TransformParameters* parameters);

// Exchanges vertical and horizontal: sampling factors and the tables' rows and columns.
TAVIRPELO_API void elo_jpeg_transpose_enc_info(pelo::jpeg::TransformParameters* parameters);

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

// The finer the steps have to become, in 1024ths, when `size` bytes are to be `target`: 1024 keeps them.
TAVIRPELO_API int __elo_get_update_gain(int size, int target);

// Makes the one or two tables those of Annex K at the source's own scale times gain / 1024, and
// multiplies the ratios by what that changes. kTooCoarse leaves everything as it was; other numbers of
// tables fail.
TAVIRPELO_API pelo::jpeg::Coarsening __elo_set_qunat_table(pelo::jpeg::TransformParameters* parameters,
                                                           int gain);

// Code a source's rows, each coefficient multiplied by its ratio: from baseline and from progressive
// data. 1 or 0.
TAVIRPELO_API int __elo_bits_control(pelo::jpeg::CoefficientSource* source,
                                     const pelo::jpeg::TransformParameters* parameters,
                                     ELO_ENCODER* encoder);
TAVIRPELO_API int __elo_prog_bits_control(pelo::jpeg::CoefficientSource* source,
                                          const pelo::jpeg::TransformParameters* parameters,
                                          ELO_ENCODER* encoder);

// Ends a turn at any point: what is coded so far is completed, with an end mark; everything is released.
TAVIRPELO_API void __elo_jpeg_abort_transform(void* context);

// Reads the whole source once, DC only, and notes where each of its rows begins. False when memory is
// short, data fail or the progress function refuses.
TAVIRPELO_API int __elo_create_row_info(pelo::jpeg::CoefficientSource* source,
                                        pelo::jpeg::RowSnapshots* snapshots);

// Notes, and goes back to, the decoder's place. Load: 0 when the source cannot be moved there.
TAVIRPELO_API void __ValorenOrbInitPartialInfo(const PELOJ_JDINFO* jdInfo,
                                               pelo::jpeg::RowSnapshot* snapshot);
TAVIRPELO_API int __ValorenOrbLoadPartialInfo(PELOJ_JDINFO* jdInfo,
                                              const pelo::jpeg::RowSnapshot* snapshot);

// Codes the MCUs of the next output row, one after another. 1 or 0.
TAVIRPELO_API int __elo_jpeg_enc_entroy_encoder(ELO_ENCODER* encoder,
                                                const pelo::jpeg::CoefficientBlock* row);

// Makes the streams. 1, or 0 when memory is short.
TAVIRPELO_API int __elo_jpeg_enc_col_encoder_init(pelo::jpeg::ColumnEncoder* columns,
                                                  ELO_ENCODER* encoder, int sourceSize);

// Codes the next column: one MCU for each stream, from the upper row down. 1 or 0.
TAVIRPELO_API int __elo_jpeg_enc_col_entroy_encoder(pelo::jpeg::ColumnEncoder* columns,
                                                    const pelo::jpeg::CoefficientBlock* column);

// Completes every stream and joins them behind the headers, with restart markers between. 1 or 0.
TAVIRPELO_API int __elo_jpeg_enc_col_encoder_finish(pelo::jpeg::ColumnEncoder* columns);
