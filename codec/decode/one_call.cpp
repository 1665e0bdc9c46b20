// One-call decoding of a file or a byte buffer into a raw image.
#include "codec/base/errors.h"
#include "tavirpelo/decode.h"
#include "tavirpelo/parse.h"

namespace {

using Decode = int (*)(TAVIRPELO_DECINFO*, void*, int, int);

// The decoder of each format code; null for none. Of an animation the still decoder takes the first
// frame.
Decode decoder_of(int format) {
  switch (format) {
    case TAVIRPELO_FORMAT_JPEG:
      return TAVIRPELO_DecodeJPEG;
    case TAVIRPELO_FORMAT_PNG:
      return TAVIRPELOI_DecodePNG;
    case TAVIRPELO_FORMAT_GIF:
    case TAVIRPELO_FORMAT_ANIMATED_GIF:
      return TAVIRPELOI_DecodeGIF;
    case TAVIRPELO_FORMAT_BMP:
      return TAVIRPELOI_DecodeBMP;
    case TAVIRPELO_FORMAT_WBMP:
      return TAVIRPELOI_DecodeWBMP;
    default:
      return nullptr;
  }
}

// A picture's source as TAVIRPELO_CreateDecInfo takes it.
struct Source {
  int ioType;
  void* address;
  int size;
};
Source file(const char* path) {
  return {TAVIRPELO_IO_FILE, const_cast<char*>(path), 0};
}
Source memory(void* buffer, int length) {
  return {TAVIRPELO_IO_MEMORY, buffer, length};
}

int decode(Decode decoder, const Source& source, TAVIRPELO_RAWINFO& raw, uint32_t option) {
  TAVIRPELO_DECINFO* decInfo = TAVIRPELO_CreateDecInfo(source.ioType, source.address, source.size,
                                                       static_cast<int>(raw.format), option);
  if (decInfo == nullptr) return 0;
  const int result =
      decoder(decInfo, raw.pData, static_cast<int>(raw.width), static_cast<int>(raw.height));
  TAVIRPELO_DestroyDecInfo(decInfo);
  return result != 0;
}

bool refuse(int code) {
  pelo::record_error(pelo::ErrorWord::kCodec, code);
  return false;
}

bool valid(const void* source, const TAVIRPELO_RAWINFO* raw) {
  const bool complete = source != nullptr && raw != nullptr && raw->pData != nullptr;
  return complete || refuse(TAVIRPELO_CODEC_ARGUMENT);
}

bool valid(const void* buffer, int length, const TAVIRPELO_RAWINFO* raw) {
  return valid(buffer, raw) && (length != 0 || refuse(TAVIRPELO_CODEC_SIZE));
}

int decode_detected(int format, const Source& source, TAVIRPELO_RAWINFO& raw, uint32_t option) {
  const Decode decoder = decoder_of(format);
  if (decoder == nullptr) return refuse(TAVIRPELO_CODEC_FORMAT);
  return decode(decoder, source, raw, option);
}

}  // namespace

int TAVIRPELO_DecodeImageFromFile(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option) {
  if (!valid(path, raw)) return 0;
  TAVIRPELO_HINFO header;
  return decode_detected(TAVIRPELO_ParseFromFile(path, &header), file(path), *raw, option);
}

int TAVIRPELO_DecodeImageFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw, uint32_t option) {
  if (!valid(buffer, length, raw)) return 0;
  TAVIRPELO_HINFO header;
  const int format = TAVIRPELO_ParseFromBuffer(buffer, length, &header);
  return decode_detected(format, memory(buffer, length), *raw, option);
}

// The one-call functions of a format.
#define TAVIRPELO_DECODE_ENTRIES(Name, name, decoder)                                                   \
  int elo_dec_##name##_from_file(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option) {           \
    return decode(decoder, file(path), *raw, option);                                                   \
  }                                                                                                     \
  int elo_dec_##name##_from_buffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw, uint32_t option) { \
    return decode(decoder, memory(buffer, length), *raw, option);                                       \
  }                                                                                                     \
  int TAVIRPELO_Decode##Name##FromFile(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option) {     \
    return valid(path, raw) ? elo_dec_##name##_from_file(path, raw, option) : 0;                        \
  }                                                                                                     \
  int TAVIRPELO_Decode##Name##FromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,              \
                                         uint32_t option) {                                             \
    return valid(buffer, length, raw) ? elo_dec_##name##_from_buffer(buffer, length, raw, option) : 0;  \
  }
TAVIRPELO_DECODE_ENTRIES(Jpeg, jpeg, TAVIRPELO_DecodeJPEG)
TAVIRPELO_DECODE_ENTRIES(Png, png, TAVIRPELOI_DecodePNG)
TAVIRPELO_DECODE_ENTRIES(Gif, gif, TAVIRPELOI_DecodeGIF)
TAVIRPELO_DECODE_ENTRIES(Bmp, bmp, TAVIRPELOI_DecodeBMP)
TAVIRPELO_DECODE_ENTRIES(WBmp, wbmp, TAVIRPELOI_DecodeWBMP)
#undef TAVIRPELO_DECODE_ENTRIES

namespace {

// The handle's next frame. The object goes with the last frame and on failure.
int decode_frame(const Source& source, const TAVIRPELO_RAWINFO& raw, uint32_t option,
                 TAVIRPELO_DECINFO** handle) {
  constexpr int kNoFurtherFrame = 3;
  const int format = static_cast<int>(raw.format);
  if (*handle == nullptr) {
    *handle = TAVIRPELO_CreateDecInfo(source.ioType, source.address, source.size, format, option);
    if (*handle == nullptr) return 0;
  }
  int result = 0;
  if ((*handle)->outFormat == format) {
    result = TAVIRPELOI_DecodeAGIF(*handle, raw.pData, static_cast<int>(raw.width),
                                   static_cast<int>(raw.height));
  }
  if (result != 0 && result != kNoFurtherFrame) return 1;
  TAVIRPELOI_AborAGIF(*handle);
  TAVIRPELO_DestroyDecInfo(*handle);
  *handle = nullptr;
  return result;
}

bool valid(TAVIRPELO_DECINFO* const* handle) {
  return handle != nullptr || refuse(TAVIRPELO_CODEC_ARGUMENT);
}

}  // namespace

int elo_dec_agif_from_file(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option,
                           TAVIRPELO_DECINFO** handle) {
  return decode_frame(file(path), *raw, option, handle);
}
int elo_dec_agif_from_buffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw, uint32_t option,
                             TAVIRPELO_DECINFO** handle) {
  return decode_frame(memory(buffer, length), *raw, option, handle);
}
int TAVIRPELO_DecodeAGifFromFile(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option,
                                 TAVIRPELO_DECINFO** handle) {
  if (!valid(path, raw) || !valid(handle)) return 0;
  return elo_dec_agif_from_file(path, raw, option, handle);
}
int TAVIRPELO_DecodeAGifFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw, uint32_t option,
                                   TAVIRPELO_DECINFO** handle) {
  if (!valid(buffer, length, raw) || !valid(handle)) return 0;
  return elo_dec_agif_from_buffer(buffer, length, raw, option, handle);
}
