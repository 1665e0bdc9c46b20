// One-call decoding of a file or a byte buffer into a raw image.
#include "tavirpelo/decode.h"
#include "tavirpelo/parse.h"

namespace {

using Decode = int (*)(TAVIRPELO_DECINFO*, void*, int, int);

// The decoder of each format code; a format without one is unsupported.
Decode decoder_of(int format) {
  switch (format) {
    case TAVIRPELO_FORMAT_JPEG: return TAVIRPELO_DecodeJPEG;
    default: return nullptr;
  }
}

// A picture's source as TAVIRPELO_CreateDecInfo takes it.
struct Source {
  int ioType;
  void* address;
  int size;
};
Source file(const char* path) { return {TAVIRPELO_IO_FILE, const_cast<char*>(path), 0}; }
Source memory(void* buffer, int length) { return {TAVIRPELO_IO_MEMORY, buffer, length}; }

int decode(Decode decoder, const Source& source, TAVIRPELO_RAWINFO& raw, uint32_t option) {
  TAVIRPELO_DECINFO* decInfo = TAVIRPELO_CreateDecInfo(source.ioType, source.address, source.size,
                                                       static_cast<int>(raw.format), option);
  if (decInfo == nullptr) return 0;
  const int result = decoder(decInfo, raw.pData, static_cast<int>(raw.width), static_cast<int>(raw.height));
  TAVIRPELO_DestroyDecInfo(decInfo);
  return result != 0;
}

bool refuse(int code) {
  debug_PeloCodecError = code;
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

int TAVIRPELO_DecodeJpegFromFile(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option) {
  return valid(path, raw) ? elo_dec_jpeg_from_file(path, raw, option) : 0;
}

int TAVIRPELO_DecodeJpegFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw, uint32_t option) {
  return valid(buffer, length, raw) ? elo_dec_jpeg_from_buffer(buffer, length, raw, option) : 0;
}

int elo_dec_jpeg_from_file(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option) {
  return decode(TAVIRPELO_DecodeJPEG, file(path), *raw, option);
}

int elo_dec_jpeg_from_buffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw, uint32_t option) {
  return decode(TAVIRPELO_DecodeJPEG, memory(buffer, length), *raw, option);
}
