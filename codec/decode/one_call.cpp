#include <memory>

#include "codec/base/dec_info.h"
#include "codec/base/errors.h"
#include "codec/decode/decode.h"
#include "codec/formats/gif/driver.h"
#include "tavirpelo/decode.h"

namespace pelo {
namespace {

struct DestroyObject {
  void operator()(TAVIRPELO_DECINFO* decInfo) const { destroy_dec_info(decInfo); }
};
using Object = std::unique_ptr<TAVIRPELO_DECINFO, DestroyObject>;

Object open(const PictureSource& source, int format, uint32_t option) {
  return Object(create_dec_info(source.ioType, source.address, source.size, format, option));
}

}  // namespace

PictureSource picture_file(const char* path) {
  return {TAVIRPELO_IO_FILE, const_cast<char*>(path), 0};
}

PictureSource picture_memory(void* buffer, int size) {
  return {TAVIRPELO_IO_MEMORY, buffer, size};
}

int parse(const PictureSource& source, TAVIRPELO_HINFO* record) {
  const Object object = open(source, TAVIRPELO_RGB565, 0);
  if (!object) return TAVIRPELO_FORMAT_UNKNOWN;
  TAVIRPELO_HINFO header;
  const int format = parse(object.get(), &header);
  if (record != nullptr) {
    header.sourceSize = record->sourceSize;
    *record = header;
  }
  return format;
}

int decode(DecodePicture decoder, const PictureSource& source, TAVIRPELO_RAWINFO& raw, uint32_t option) {
  const Object object = open(source, static_cast<int>(raw.format), option);
  if (!object) return 0;
  const auto width = static_cast<int>(raw.width), height = static_cast<int>(raw.height);
  return decoder(object.get(), raw.pData, width, height) != 0;
}

int decode_detected(const PictureSource& source, TAVIRPELO_RAWINFO& raw, uint32_t option) {
  TAVIRPELO_HINFO header{};
  const Format* format = format_of(parse(source, &header));
  if (format == nullptr) {
    record_error(ErrorWord::kCodec, TAVIRPELO_CODEC_FORMAT);
    return 0;
  }
  return decode(format->decode, source, raw, option);
}

int decode_frame(const PictureSource& source, const TAVIRPELO_RAWINFO& raw, uint32_t option,
                 TAVIRPELO_DECINFO** handle) {
  constexpr int kNoFurtherFrame = 3;
  const int format = static_cast<int>(raw.format);
  if (*handle == nullptr) *handle = open(source, format, option).release();
  if (*handle == nullptr) return 0;
  int result = 0;
  if ((*handle)->outFormat == format) {
    const auto width = static_cast<int>(raw.width), height = static_cast<int>(raw.height);
    result = gif::decode_frame(*handle, raw.pData, width, height);
  } else {
    refuse(Reason::kRequestChanged, "animation");
  }
  if (result != 0 && result != kNoFurtherFrame) return 1;
  gif::abort_animation(*handle);
  destroy_dec_info(*handle);
  *handle = nullptr;
  return result;
}

}  // namespace pelo
