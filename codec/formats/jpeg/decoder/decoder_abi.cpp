// The given names of this room; each forwards to the room's own function.
#include "codec/formats/jpeg/decoder/decoder_abi.h"

#include "codec/base/errors.h"
#include "tavirpelo/api.h"
#include "tavirpelo/decinfo.h"
#include "tavirpelo/decode.h"

using namespace pelo;
using namespace pelo::jpeg;

int PELOJ_ReadBits(BitReader* reader, BitBuffer buffer, int bitsLeft, int needed) {
  return jpeg::refill_bits(reader, buffer, bitsLeft, needed);
}

int PELOJ_DecodeHuffMan(BitReader* reader, BitBuffer buffer, int bitsLeft, const DerivedTable* derived,
                        int minBits) {
  return jpeg::decode_code(reader, buffer, bitsLeft, derived, minBits);
}

void PELOJ_DoYcbcrToRgb(PELOJ_JDINFO* jdInfo, uint8_t**, int rows) {
  jpeg::average_ycc(jdInfo, rows);
}

void PELOJ_DoYcbcrToUpscaleRgb(PELOJ_JDINFO* jdInfo, uint8_t**, int rows) {
  jpeg::enlarge_ycc(jdInfo, rows);
}

void PELOJ_DoFastYcbcrToRgb(PELOJ_JDINFO* jdInfo, uint8_t**, int rows) {
  jpeg::pick_ycc(jdInfo, rows);
}

void PELOJ_DoFastYcbcrToUpscaleRgb(PELOJ_JDINFO* jdInfo, uint8_t**, int rows) {
  jpeg::pick_enlarging_ycc(jdInfo, rows);
}

void PELOJ_DoGrayConvert(PELOJ_JDINFO* jdInfo, uint8_t**, int rows) {
  jpeg::average_grey(jdInfo, rows);
}

void PELOJ_DoGrayUpscaleConvert(PELOJ_JDINFO* jdInfo, uint8_t**, int rows) {
  jpeg::enlarge_grey(jdInfo, rows);
}

void PELOJ_DoRgbConvert(PELOJ_JDINFO* jdInfo, uint8_t**, int rows) {
  jpeg::average_rgb(jdInfo, rows);
}

void PELOJ_DoRgbUpscaleConvert(PELOJ_JDINFO* jdInfo, uint8_t**, int rows) {
  jpeg::enlarge_rgb(jdInfo, rows);
}

PELOJ_JDINFO* PELOJ_Initialize(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source,
                               PELOJ_REQUEST* request) {
  return jpeg::initialize_decoder(decInfo, source, request);
}

int PELOJ_StartDecompression(PELOJ_JDINFO* jdInfo) {
  return jpeg::start_decompression(jdInfo);
}

int PELOJ_DecodeImage(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source, PELOJ_REQUEST* request) {
  return jpeg::decode_image(decInfo, source, request);
}

int PELOJ_ValorenDecodeFrame(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source, void* outBuffer,
                             int reqWidth, int reqHeight) {
  return jpeg::decode_frame(decInfo, source, outBuffer, reqWidth, reqHeight);
}

int PELOJ_PrepareDerivedTbl(PELOJ_JDINFO* jdInfo, int isDC, int tableNumber,
                            const DerivedTable** derivedOut, EntropyState* entropy) {
  EntropyState* skipping = jpeg::skip_tables(*jdInfo) != nullptr ? entropy : nullptr;
  return jpeg::derive_table(jdInfo->tables, isDC != 0, tableNumber, skipping, derivedOut);
}

int PELOJ_DecodeSingleiMcu(PELOJ_JDINFO* jdInfo, uint8_t***) {
  return jpeg::decode_imcu_row(jdInfo);
}

int PELOJ_DecodeSingleiMcu_resize(PELOJ_JDINFO* jdInfo, uint8_t***) {
  return jpeg::decode_imcu_row_scaled(jdInfo);
}

void PELOJ_DeleteDecoderInfo(PELOJ_JDINFO* jdInfo) {
  jpeg::clear_decoder(jdInfo);
}

int PELOJ_ParseHeader(PELOJ_JDINFO* jdInfo, int) {
  return jpeg::parse_header(jdInfo);
}

int PELOJ_ParseNextMarker(PELOJ_JDINFO* jdInfo, int* status) {
  return jpeg::parse_to_scan(jdInfo, status);
}

int PELOJ_DecodeMcu(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return jpeg::decode_mcu_full(jdInfo, blocks);
}

int PELOJ_FastDecodeMcu(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return jpeg::decode_mcu_requantised(jdInfo, blocks);
}

int PELOJ_DecodeMcu_2to1(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return jpeg::decode_mcu_half(jdInfo, blocks);
}

int PELOJ_DecodeMcu_8to3(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return jpeg::decode_mcu_three_eighths(jdInfo, blocks);
}

int PELOJ_DecodeMcu_4to1(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return jpeg::decode_mcu_quarter(jdInfo, blocks);
}

int PELOJ_DecodeMcu8to1(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return jpeg::decode_mcu_dc(jdInfo, blocks);
}

int PELOJ_ProcessRestartMarker(PELOJ_JDINFO* jdInfo) {
  return jpeg::process_restart(*jdInfo->source, jdInfo->entropy, *jdInfo->marker,
                               jdInfo->scan.restartInterval);
}

int PELOJ_SetupScanInfo(PELOJ_JDINFO* jdInfo, OsPtr<ScanRecord>* slot) {
  return jpeg::make_scan_record(jdInfo, slot);
}

void PELOJ_SaveScanInfo(PELOJ_JDINFO* jdInfo, ScanRecord* record) {
  jpeg::save_scan(jdInfo, record);
}

int PELOJ_LoadScanInfo(PELOJ_JDINFO* jdInfo, const ScanRecord* record) {
  return jpeg::load_scan(jdInfo, record);
}

int PELOJ_ProgDecodeMcu(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return jpeg::decode_mcu_first(jdInfo, blocks);
}

int PELOJ_ProgDecodeMcuRefine(PELOJ_JDINFO* jdInfo, int32_t* const* blocks) {
  return jpeg::decode_mcu_refine(jdInfo, blocks);
}

int PELOJ_ProgDecodeSingleiMcu(PELOJ_JDINFO* jdInfo, uint8_t***) {
  return jpeg::decode_progressive_row(jdInfo);
}

int PELOJ_ProgIDct(PELOJ_JDINFO* jdInfo, uint8_t***) {
  return jpeg::transform_stored_row(jdInfo);
}

void PELOJ_YcbcrWriteOutput1to1(PELOJ_JDINFO* jdInfo, const uint8_t* y, const uint8_t* cb,
                                const uint8_t* cr, int count) {
  jpeg::write_ycc_row(jdInfo->output, y, cb, cr, count);
}

void PELOJ_GrayWriteOutput1to1(PELOJ_JDINFO* jdInfo, const uint8_t* y, int count) {
  jpeg::write_grey_row(jdInfo->output, y, count);
}

void PELOJ_RGBWriteOutput1to1(PELOJ_JDINFO* jdInfo, const uint8_t* r, const uint8_t* g, const uint8_t* b,
                              int count) {
  jpeg::write_rgb_row(jdInfo->output, r, g, b, count);
}

void PELOJ_FastYcbcrWriteOutput(PELOJ_JDINFO* jdInfo, const uint8_t* y, const uint8_t* cb,
                                const uint8_t* cr, int count) {
  jpeg::write_picked_row(jdInfo->output, jdInfo->resampling.centres.data(), y, cb, cr, count);
}

void PELOJ_FastYcbcrUpscaleWriteOutput(PELOJ_JDINFO* jdInfo, const uint8_t* y, const uint8_t* cb,
                                       const uint8_t* cr, int count) {
  jpeg::write_picked_row(jdInfo->output, jdInfo->resampling.centres.data(), y, cb, cr, count);
}

void PELOJ_YcbcrWriteOutput(PELOJ_JDINFO* jdInfo, const uint32_t* sums, int count) {
  jpeg::write_ycc_sums(jdInfo->output, sums, count);
}

void PELOJ_GrayWriteOutput(PELOJ_JDINFO* jdInfo, const uint32_t* sums, int count) {
  jpeg::write_grey_sums(jdInfo->output, sums, count);
}

void PELOJ_RGBWriteOutput(PELOJ_JDINFO* jdInfo, const uint32_t* sums, int count) {
  jpeg::write_rgb_sums(jdInfo->output, sums, count);
}

int PELOJ_ProcessData(PELOJ_JDINFO* jdInfo, uint8_t**, int* rowCounter, int rowsWanted) {
  return jpeg::process_rows(jdInfo, rowCounter, rowsWanted);
}

int PELOJ_ProcessData_resize(PELOJ_JDINFO* jdInfo, uint8_t**, int* rowCounter, int rowsWanted) {
  return jpeg::process_rows_scaled(jdInfo, rowCounter, rowsWanted);
}

int PELOJ_ProgProcessData(PELOJ_JDINFO* jdInfo, uint8_t**, int* rowCounter, int rowsWanted) {
  return jpeg::process_progressive_rows(jdInfo, rowCounter, rowsWanted);
}

int PELOJ_ProgProcessData_resize(PELOJ_JDINFO* jdInfo, uint8_t**, int* rowCounter, int rowsWanted) {
  return jpeg::process_progressive_rows_scaled(jdInfo, rowCounter, rowsWanted);
}

int PELOJ_SetupScan(PELOJ_JDINFO* jdInfo) {
  return jpeg::set_up_scan(jdInfo);
}

int PELOJ_InitDecBeforeScan(PELOJ_JDINFO* jdInfo) {
  return jpeg::prepare_before_scan(jdInfo);
}

void PELOJ_SetupiMcu(PELOJ_JDINFO* jdInfo) {
  jpeg::begin_imcu_row(jdInfo->scan, jdInfo->progress.imcuRow);
}

void PELOJ_DoFullsizeUpsample(PELOJ_JDINFO* jdInfo, Component*, uint8_t** input, uint8_t*** slot) {
  jpeg::use_rows_as_they_are(jdInfo->frame.vMax, input, *slot);
}

void PELOJ_DoH2V1Upsample(PELOJ_JDINFO* jdInfo, Component* component, uint8_t** input, uint8_t*** slot) {
  jpeg::replicate_rows(*component, jdInfo->frame.vMax, input, *slot);
}

void PELOJ_DoH2V2Upsample(PELOJ_JDINFO* jdInfo, Component* component, uint8_t** input, uint8_t*** slot) {
  jpeg::replicate_rows(*component, jdInfo->frame.vMax, input, *slot);
}

void PELOJ_DoIntegralUpsample(PELOJ_JDINFO* jdInfo, Component* component, uint8_t** input,
                              uint8_t*** slot) {
  jpeg::replicate_rows(*component, jdInfo->frame.vMax, input, *slot);
}

void PELOJ_SetupUpsample(PELOJ_JDINFO* jdInfo, uint8_t**, int* rowCounter, int capacity) {
  jpeg::convert_rows(jdInfo, rowCounter, capacity);
}

void PELOJ_SkipRowUpsample(PELOJ_JDINFO* jdInfo, uint8_t**, int* rowCounter, int capacity) {
  jpeg::skip_rows_unconverted(jdInfo, rowCounter, capacity);
}

int PELOJ_InitUpsampler(PELOJ_JDINFO* jdInfo) {
  return jpeg::prepare_upsampling(jdInfo->frame, jdInfo->sizes.scale, jdInfo->progress);
}

uint8_t** PELOJ_AllocSampleArry(int width, int rows) {
  return jpeg::allocate_rows(width, rows);
}

int TAVIRPELO_DecodeJPEG(TAVIRPELO_DECINFO* decInfo, void* outBuffer, int reqWidth, int reqHeight) {
  begin_operation();
  return jpeg::decode(decInfo, outBuffer, reqWidth, reqHeight);
}

int PELOJ_DecodeThumbnail(TAVIRPELO_DECINFO* decInfo, void* outBuffer, int reqWidth, int reqHeight,
                          int* outWidth, int* outHeight) {
  return jpeg::decode_thumbnail(decInfo, outBuffer, reqWidth, reqHeight, outWidth, outHeight);
}

int PELOJ_GetDecSize(const TAVIRPELO_DECINFO* decInfo, int* width, int* height) {
  return jpeg::produced_size(decInfo, width, height);
}

int PELOJ_RotateImage90(void* buffer, int width, int height, int outFormat) {
  return jpeg::rotate_buffer_90(buffer, width, height, outFormat);
}

int PELOJ_RotateImage270(void* buffer, int width, int height, int outFormat) {
  return jpeg::rotate_buffer_270(buffer, width, height, outFormat);
}

int PELOJ_DecodeUncompressThumbnail(void) {
  return 1;
}

// One member each, of one argument list.
#define PELOJ_FORWARD_IDCT(name, ...)                                                              \
  void name(const uint8_t*, const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, \
            int column) {                                                                          \
    jpeg::__VA_ARGS__(multiplier, block, rows, column);                                            \
  }
PELOJ_FORWARD_IDCT(PELOJ_DoIdct8By8, idct8<8, 8>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct, idct8<8, 8>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct4By4, idct8<4, 4>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct3By3, idct8<3, 3>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct2By2, idct8_corner)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct2By2All, idct8<2, 2>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct2By1, idct8<2, 1>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct1By2, idct8<1, 2>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct1By1, idct8<1, 1>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct4x4For4x4, idct4<4, 4>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct3x3For4x4, idct4<3, 3>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct2x2For4x4, idct4_corner)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct2x2AllFor4x4, idct4<2, 2>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct2x1For4x4, idct4<2, 1>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct1x2For4x4, idct4<1, 2>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct1x1For4x4, idct4<1, 1>)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct_2to1, idct_reduced4)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct_8to3, idct_reduced3)
PELOJ_FORWARD_IDCT(PELOJ_DoIdct_4to1, idct_reduced2)
