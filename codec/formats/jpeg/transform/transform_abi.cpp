// The given names of this room; each forwards to the room's own function.
#include "codec/formats/jpeg/transform/transform_abi.h"

#include "codec/base/errors.h"
#include "tavirpelo/parse.h"
#include "tavirpelo/transform.h"

using namespace pelo;
using namespace pelo::jpeg;

void __elo_flip_h(const CoefficientBlock* in, CoefficientBlock* out) {
  jpeg::flip_across(in, out);
}

void __elo_flip_v(const CoefficientBlock* in, CoefficientBlock* out) {
  jpeg::flip_down(in, out);
}

void __elo_rotate_90(const CoefficientBlock* in, CoefficientBlock* out) {
  jpeg::rotate_block_90(in, out);
}

void __elo_rotate_180(const CoefficientBlock* in, CoefficientBlock* out) {
  jpeg::rotate_block_180(in, out);
}

void __elo_rotate_270(const CoefficientBlock* in, CoefficientBlock* out) {
  jpeg::rotate_block_270(in, out);
}

void __elo_ro90_f(const CoefficientBlock* in, CoefficientBlock* out) {
  jpeg::rotate_block_90_flipped(in, out);
}

void __elo_ro270_f(const CoefficientBlock* in, CoefficientBlock* out) {
  jpeg::rotate_block_270_flipped(in, out);
}

void __elo_jpeg_adv_set_enc_info_from_dec_info(CoefficientSource* source,
                                               TransformParameters* parameters) {
  jpeg::parameters_of_source(source, parameters);
}

void elo_jpeg_transpose_enc_info(TransformParameters* parameters) {
  jpeg::transpose_parameters(parameters);
}

int __elo_get_outimage_scale_ratio(int width, int height, int target) {
  return jpeg::scale_for_target(width, height, target);
}

int __elo_resize_jpeg_image(void* source, int size, int kind, int width, int height,
                            const TAVIRPELO_APP1* app1, ELO_DESTINATION* destination) {
  return jpeg::resize_within(source, size, kind, width, height, app1, destination);
}

int __elo_bits_contol_encode(void* source, int size, int kind, ELO_DESTINATION* destination,
                             int target) {
  return jpeg::encode_within_target(source, size, kind, destination, target);
}

int __elo_get_update_gain(int size, int target) {
  return jpeg::updated_gain(size, target);
}

Coarsening __elo_set_qunat_table(TransformParameters* parameters, int gain) {
  return jpeg::set_gained_table(parameters, gain);
}

int __elo_bits_control(CoefficientSource* source, const TransformParameters* parameters,
                       ELO_ENCODER* encoder) {
  return jpeg::requantise_sequential(source, parameters, encoder);
}

int __elo_prog_bits_control(CoefficientSource* source, const TransformParameters* parameters,
                            ELO_ENCODER* encoder) {
  return jpeg::requantise_progressive(source, parameters, encoder);
}

void __elo_jpeg_abort_transform(void* context) {
  jpeg::abort_turn(context);
}

int __elo_create_row_info(CoefficientSource* source, RowSnapshots* snapshots) {
  return jpeg::make_row_record(source, snapshots);
}

void __ValorenOrbInitPartialInfo(const PELOJ_JDINFO* jdInfo, RowSnapshot* snapshot) {
  jpeg::init_partial(jdInfo, snapshot);
}

int __ValorenOrbLoadPartialInfo(PELOJ_JDINFO* jdInfo, const RowSnapshot* snapshot) {
  return jpeg::load_partial(jdInfo, snapshot);
}

int __elo_jpeg_enc_entroy_encoder(ELO_ENCODER* encoder, const CoefficientBlock* row) {
  return jpeg::code_stream(encoder, row);
}

int __elo_jpeg_enc_col_encoder_init(ColumnEncoder* columns, ELO_ENCODER* encoder, int sourceSize) {
  return jpeg::begin_column(columns, encoder, sourceSize);
}

int __elo_jpeg_enc_col_entroy_encoder(ColumnEncoder* columns, const CoefficientBlock* column) {
  return jpeg::code_column(columns, column);
}

int __elo_jpeg_enc_col_encoder_finish(ColumnEncoder* columns) {
  return jpeg::finish_column(columns);
}

int elo_rotate_jpeg(void* source, int size, int width, int height, ELO_DESTINATION* destination,
                    int angle, int flip, ELO_TRANSFORMSTATE* state) {
  return jpeg::rotate_jpeg(source, size, width, height, destination, angle, flip, state);
}

int elo_abort_rotate_jpeg(ELO_TRANSFORMSTATE* state) {
  return jpeg::abort_rotation(state);
}

int elo_re_encode_to_buffer(void* source, int size, int kind, uint8_t** buffer, int* outSize,
                            int target) {
  return jpeg::reencode_to_buffer(source, size, kind, buffer, outSize, target);
}

int elo_re_encode_to_file(void* source, int size, int kind, const char* path, int target) {
  return jpeg::reencode_to_file(source, size, kind, path, target);
}

int TAVIRPELO_ReEncodeJpegToBuffer(void* source, int size, int kind, uint8_t** buffer, int* outSize,
                                   int target) {
  begin_operation();
  if (source == nullptr || buffer == nullptr || *buffer == nullptr || outSize == nullptr) {
    record_error(ErrorWord::kCodec, TAVIRPELO_CODEC_ARGUMENT);
    return 0;
  }
  return reencode_to_buffer(source, size, kind, buffer, outSize, target);
}

int TAVIRPELO_ReEncodeJpegToFile(void* source, int size, int kind, const char* path, int target) {
  begin_operation();
  return source != nullptr ? reencode_to_file(source, size, kind, path, target) : 0;
}
