// The given names of detection, one-call parsing and one-call decoding: argument checks, then the room's
// own functions.
#include "codec/decode/decode_abi.h"

#include "codec/base/errors.h"
#include "codec/decode/decode.h"
#include "codec/formats/bmp/bmp_record.h"
#include "codec/formats/gif/driver.h"
#include "tavirpelo/decode.h"

namespace pelo {
namespace {

int refuse_with(int code) {
  record_error(ErrorWord::kCodec, code);
  return 0;
}

bool complete(const void* source, const void* result) {
  begin_operation();
  return (source != nullptr && result != nullptr) || refuse_with(TAVIRPELO_CODEC_ARGUMENT);
}

bool not_empty(int size) {
  return size != 0 || refuse(Reason::kEmpty, "opening the source") || refuse_with(TAVIRPELO_CODEC_SIZE);
}

bool writable(const TAVIRPELO_RAWINFO* raw) {
  return raw->pData != nullptr || refuse_with(TAVIRPELO_CODEC_ARGUMENT);
}

bool valid(const void* path, const TAVIRPELO_RAWINFO* raw) {
  return complete(path, raw) && writable(raw);
}

bool valid(const void* buffer, int length, const TAVIRPELO_RAWINFO* raw) {
  return valid(buffer, raw) && not_empty(length);
}

bool valid(TAVIRPELO_DECINFO* const* handle) {
  return handle != nullptr || refuse_with(TAVIRPELO_CODEC_ARGUMENT);
}

}  // namespace
}  // namespace pelo

using namespace pelo;

// ---- parsing ----

int TAVIRPELO_Parser(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_HINFO* hinfo) {
  begin_operation();
  return parse(decInfo, hinfo);
}

int PELO_Parse(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source, TAVIRPELO_HINFO* hinfo) {
  return detect(*decInfo, *source, hinfo);
}

int __PELO_ParserGIF(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source, TAVIRPELO_HINFO* hinfo) {
  return gif::parse_head(*decInfo, *source, hinfo);
}

int __PELO_ParserWBMP(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source) {
  return bmp::parse_wbmp_sizes(*decInfo, *source);
}

int elo_parse_from_file(const char* path, TAVIRPELO_HINFO* record) {
  return parse(picture_file(path), record);
}

int elo_parse_from_buffer(void* buffer, int size, TAVIRPELO_HINFO* record) {
  return parse(picture_memory(buffer, size), record);
}

int TAVIRPELO_ParseFromFile(const char* path, TAVIRPELO_HINFO* record) {
  if (!complete(path, record)) return TAVIRPELO_FORMAT_UNKNOWN;
  *record = {};
  return parse(picture_file(path), record);
}

int TAVIRPELO_ParseFromBuffer(void* buffer, int size, TAVIRPELO_HINFO* record) {
  if (!complete(buffer, record) || !not_empty(size)) return TAVIRPELO_FORMAT_UNKNOWN;
  *record = {};
  return parse(picture_memory(buffer, size), record);
}

// ---- decoding ----

int TAVIRPELO_DecodeParsed(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  begin_operation();
  const Format* format = decInfo == nullptr ? nullptr : format_of(decInfo->imageFormat);
  if (format == nullptr) {
    return refuse(decInfo == nullptr ? Reason::kArgument : Reason::kUnknownFormat, "decoding");
  }
  return format->decode(decInfo, output, width, height);
}

int TAVIRPELO_DecodeImageFromFile(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option) {
  return valid(path, raw) ? decode_detected(picture_file(path), *raw, option) : 0;
}

int TAVIRPELO_DecodeImageFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw, uint32_t option) {
  return valid(buffer, length, raw) ? decode_detected(picture_memory(buffer, length), *raw, option) : 0;
}

// The functions of a format.
#define TAVIRPELO_DECODE_ENTRIES(Name, name, code)                                                      \
  int elo_dec_##name##_from_file(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option) {           \
    return decode(format_of(code)->decode, picture_file(path), *raw, option);                           \
  }                                                                                                     \
  int elo_dec_##name##_from_buffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw, uint32_t option) { \
    return decode(format_of(code)->decode, picture_memory(buffer, length), *raw, option);               \
  }                                                                                                     \
  int TAVIRPELO_Decode##Name##FromFile(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option) {     \
    return valid(path, raw) ? elo_dec_##name##_from_file(path, raw, option) : 0;                        \
  }                                                                                                     \
  int TAVIRPELO_Decode##Name##FromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,              \
                                         uint32_t option) {                                             \
    return valid(buffer, length, raw) ? elo_dec_##name##_from_buffer(buffer, length, raw, option) : 0;  \
  }
TAVIRPELO_DECODE_ENTRIES(Jpeg, jpeg, TAVIRPELO_FORMAT_JPEG)
TAVIRPELO_DECODE_ENTRIES(Png, png, TAVIRPELO_FORMAT_PNG)
TAVIRPELO_DECODE_ENTRIES(Gif, gif, TAVIRPELO_FORMAT_GIF)
TAVIRPELO_DECODE_ENTRIES(Bmp, bmp, TAVIRPELO_FORMAT_BMP)
TAVIRPELO_DECODE_ENTRIES(WBmp, wbmp, TAVIRPELO_FORMAT_WBMP)
#undef TAVIRPELO_DECODE_ENTRIES

int elo_dec_agif_from_file(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option,
                           TAVIRPELO_DECINFO** handle) {
  return decode_frame(picture_file(path), *raw, option, handle);
}

int elo_dec_agif_from_buffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw, uint32_t option,
                             TAVIRPELO_DECINFO** handle) {
  return decode_frame(picture_memory(buffer, length), *raw, option, handle);
}

int TAVIRPELO_DecodeAGifFromFile(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option,
                                 TAVIRPELO_DECINFO** handle) {
  return valid(path, raw) && valid(handle) ? elo_dec_agif_from_file(path, raw, option, handle) : 0;
}

int TAVIRPELO_DecodeAGifFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw, uint32_t option,
                                   TAVIRPELO_DECINFO** handle) {
  if (!valid(buffer, length, raw) || !valid(handle)) return 0;
  return elo_dec_agif_from_buffer(buffer, length, raw, option, handle);
}

// ---- cropping a file ----

int TAVIRPELO_CropDecoding(const char* path, void* outBuffer, int width, int height) {
  begin_operation();
  return decode_small(path, outBuffer, width, height);
}

int TAVIRPELO_CropFromImage(const char* path, TAVIRPELO_CROPRECT* rect, void* dst, int dstWidth,
                            int dstHeight, uint32_t option, int memoryLimit) {
  begin_operation();
  return crop_file(path, rect, dst, dstWidth, dstHeight, option, memoryLimit);
}
