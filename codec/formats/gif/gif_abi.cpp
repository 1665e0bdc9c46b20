// The given names of this room; each forwards to the room's own function.
#include "codec/formats/gif/gif_abi.h"

#include "codec/base/errors.h"
#include "tavirpelo/api.h"
#include "tavirpelo/decinfo.h"
#include "tavirpelo/decode.h"
#include "tavirpelo/io.h"

namespace gif = pelo::gif;
using namespace gif;
using pelo::begin_operation;

int PELOI_MakeFrameLineBuffer(Record* record) {
  return gif::compose_row(record);
}

Record* PELOI_InitializeGIF(TAVIRPELO_DECINFO* decInfo, int width, int height, int animated,
                            void* output) {
  return gif::make_record(decInfo, width, height, animated, output);
}

int PELOI_DecodeGIFImage(TAVIRPELO_IO* source, Record* record, void* output) {
  return gif::decode_image(source, record, output);
}

int PELOI_DecodeGIFImageIter(TAVIRPELO_IO* source, Record* record, void* output, int start) {
  return gif::decode_image_step(source, record, output, start);
}

int PELOI_DecodeGIFImageLine(TAVIRPELO_IO* source, Record* record, void* output, int lines, int start) {
  return gif::decode_image_lines(source, record, output, lines, start);
}

int PELOI_WriteGIFOneToOneRow(Record* record, void* output) {
  return gif::write_row(record, output);
}

int PELOI_DownsizeGIFRow(Record* record, void* output) {
  return gif::write_sampled_rows(record, output);
}

int PELOI_WriteAGIFOneToOneRow(Record* record, void* output) {
  return gif::write_screen_pixels(record, output);
}

int PELOI_DownsizeAGIFRow(Record* record, void* output) {
  return gif::write_sampled_screen(record, output);
}

int PELOI_WriteTheLine(Record* record, void* output) {
  return gif::write_line(record, output);
}

int PELOI_GIFMakeOut1Row(Record* record, void* output, int* consumed) {
  return gif::write_output_row(record, output, consumed);
}

void PELOI_MakeColorTable(const uint8_t* rgbBytes, int count, uint32_t* table) {
  gif::pack_table(rgbBytes, count, table);
}

int PELOI_ParseGIFHeader(TAVIRPELO_IO* source, Record* record) {
  return gif::parse_header(source, record);
}

int PELOI_SeekImageData(TAVIRPELO_IO* source, Record* record) {
  return gif::seek_image(source, record);
}

int PELOI_CheckBuffer(int need, TAVIRPELO_IO* source, uint8_t* buffer, int* remaining,
                      uint8_t** cursor) {
  return gif::fill_buffer(need, source, buffer, remaining, cursor);
}

Record* PELOI_CreateGIFDecoderInfo() {
  return gif::new_record();
}

void PELOI_DelGIFDecoderInfo(Record* record) {
  gif::delete_record(record);
}

int PELOI_InitializeTransTBL(int minimumCodeSize, TranslationTable* table) {
  return gif::init_table(minimumCodeSize, table);
}

int TAVIRPELOI_DecodeGIF(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  begin_operation();
  return gif::decode(decInfo, output, width, height);
}

int TAVIRPELOI_DecodeGIFLine(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height,
                             int lines) {
  begin_operation();
  return gif::decode_lines(decInfo, output, width, height, lines);
}

int TAVIRPELOI_DecodeGIFIter(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  begin_operation();
  return gif::decode_step(decInfo, output, width, height);
}

int TAVIRPELOI_AbortGIFIter(TAVIRPELO_DECINFO* decInfo) {
  return gif::abort(decInfo);
}

int TAVIRPELOI_DecodeAGIF(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  begin_operation();
  return gif::decode_frame(decInfo, output, width, height);
}

int TAVIRPELOI_DecodeAGIFIter(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  begin_operation();
  return gif::decode_frame_step(decInfo, output, width, height);
}

int TAVIRPELOI_AborAGIF(TAVIRPELO_DECINFO* decInfo) {
  return gif::abort_animation(decInfo);
}

void PELOI_WriteCharacter(uint32_t character, int position, uint8_t* lineBuffer) {
  gif::write_index(character, position, lineBuffer);
}

uint8_t PELOI_TranslateCode(uint32_t code, const TranslationTable* table, int position,
                            uint8_t* lineBuffer, int* errorFlag) {
  return gif::translate(code, table, position, lineBuffer, errorFlag);
}

void PELOI_AddToTranslationTable(uint32_t prefix, uint8_t character, uint32_t code,
                                 TranslationTable* table) {
  gif::add_entry(prefix, character, code, table);
}

// ---- without a caller in the library ----

uint32_t PELOI_DecoderBufferToOutBit(uint32_t value) {
  return value;
}

void _interpolate_rgb888(const uint8_t* upperLeft, const uint8_t* upperRight, const uint8_t* lowerLeft,
                         const uint8_t* lowerRight, uint32_t x, uint32_t y, uint8_t* result) {
  for (int c = 0; c < 3; ++c) {
    const uint32_t upper = upperLeft[c] * (256 - x) + upperRight[c] * x;
    const uint32_t lower = lowerLeft[c] * (256 - x) + lowerRight[c] * x;
    result[c] = static_cast<uint8_t>((upper * (256 - y) + lower * y + 0x8000) >> 16);
  }
}
