// The JPEG decode entry: an embedded thumbnail when the option word allows it, else the main picture;
// and turning a decoded buffer in place.
#include <cstring>

#include "codec/base/errors.h"
#include "codec/base/io.h"
#include "codec/base/os_memory.h"
#include "codec/formats/jpeg/decoder/driver.h"
#include "codec/formats/jpeg/header_scan.h"
#include "codec/pixel/row_stores.h"
#include "platform/android_log.h"
#include "tavirpelo/decode.h"

namespace pelo::jpeg {
namespace {

struct Request {
  void* buffer;
  int width, height;
};

// The header scan on the way to a decode; nothing is present when it fails. What it fails of is for the
// decode itself to tell, if that fails too.
PELOJ_FILEHEADER scan_header(PELOJ_SOURCE& source) {
  PELOJ_FILEHEADER header{};
  if (scan_file_header(&source, kScanMode, &header) == PELOJ_OK) return header;
  begin_operation();
  return {};
}

// True when an embedded JPEG is at least as large as the request; reads its own header for that. Fills
// the thumbnail's size.
bool large_enough(PELOJ_SOURCE& source, PELOJ_THUMBNAIL& thumbnail, const Request& request) {
  if (thumbnail.type == PELOJ_THUMBNAIL_PHOTOSHOP) {
    return thumbnail.width != 0 && thumbnail.height != 0 && request.width < thumbnail.width &&
           request.height < thumbnail.height;
  }
  if (thumbnail.type != PELOJ_THUMBNAIL_JPEG || !source.move_to(thumbnail.offset)) return false;
  const PELOJ_FILEHEADER header = scan_header(source);
  if (header.width == 0 || header.height == 0) return false;
  thumbnail.width = header.width;
  thumbnail.height = header.height;
  return request.width <= header.width && request.height <= header.height;
}

bool usable(PELOJ_SOURCE& source, PELOJ_THUMBNAIL& thumbnail, uint32_t policy, const Request& request) {
  if (!thumbnail_in_source(thumbnail, source.size)) return false;
  if (policy == TAVIRPELO_THUMBNAIL_ANY) {
    return thumbnail.type == PELOJ_THUMBNAIL_JPEG || thumbnail.type == PELOJ_THUMBNAIL_PHOTOSHOP;
  }
  return large_enough(source, thumbnail, request);
}

bool decode_at(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE& source, uint32_t offset, int imageWidth,
               int imageHeight, const Request& request) {
  if (!source.move_to(offset)) {
    log_error("TAVIRPELO_DecodeJPEG : seek Fail");
    return false;
  }
  decInfo.imageWidth = imageWidth;
  decInfo.imageHeight = imageHeight;
  return decode_frame(&decInfo, &source, request.buffer, request.width, request.height) != 0;
}

// The thumbnail turned to the main picture's orientation, when the two differ.
bool decode_turned(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE& source, const PELOJ_FILEHEADER& header,
                   const Request& request) {
  const PELOJ_THUMBNAIL& thumbnail = header.thumbnail;
  const bool portrait = header.height > header.width;
  const bool differs =
      portrait ? thumbnail.width > thumbnail.height : thumbnail.height > thumbnail.width;
  if (!differs) {
    return decode_at(decInfo, source, thumbnail.offset, thumbnail.width, thumbnail.height, request);
  }
  const Request transposed{request.buffer, request.height, request.width};
  return decode_at(decInfo, source, thumbnail.offset, thumbnail.width, thumbnail.height, transposed) &&
         rotate_buffer_90(request.buffer, request.height, request.width, decInfo.outFormat) != 0;
}

bool decode(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE& source, const Request& request) {
  const uint32_t policy = decInfo.option & TAVIRPELO_THUMBNAIL_MASK;
  int width = 0;
  int height = 0;
  if (policy != TAVIRPELO_THUMBNAIL_NEVER) {
    PELOJ_FILEHEADER header = scan_header(source);
    if (policy != TAVIRPELO_THUMBNAIL_ANY) {
      width = header.width;
      height = header.height;
    }
    if (usable(source, header.thumbnail, policy, request)) {
      if (policy == TAVIRPELO_THUMBNAIL_TURNED) return decode_turned(decInfo, source, header, request);
      const PELOJ_THUMBNAIL& thumbnail = header.thumbnail;
      if (decode_at(decInfo, source, thumbnail.offset, thumbnail.width, thumbnail.height, request)) {
        return true;
      }
      // What the thumbnail failed of says nothing about the main picture.
      begin_operation();
      record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
    }
  }
  return decode_at(decInfo, source, 0, width, height, request);
}

// A reader at the start of the object's source; false with a line in the log.
bool open_source(TAVIRPELO_DECINFO& decInfo, BufferedSource& source) {
  if (!source.open(decInfo.pIO)) {
    record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_MEMORY);
    log_error("TAVIRPELO_DecodeJPEG : malloc Fail");
    return false;
  }
  if (seek_io(decInfo.pIO, 0, SEEK_SET) < 0) {
    log_error("TAVIRPELO_DecodeJPEG : seek Fail");
    return false;
  }
  return true;
}

// Through a second buffer: rows become columns, so that in place every pixel would chase another.
int rotate(void* buffer, int width, int height, int outFormat, bool clockwise) {
  const bool known = outFormat == TAVIRPELO_RGB565 || outFormat == TAVIRPELO_RGB888 ||
                     outFormat == TAVIRPELO_RGB565_DITHER;
  if (!known || buffer == nullptr || width < 1 || height < 1) return 0;
  const auto size = static_cast<size_t>(pelo::bytes_per_pixel(outFormat));
  const auto w = static_cast<size_t>(width);
  const auto h = static_cast<size_t>(height);
  const auto pixels = pelo::checked_mul(w, h);
  const auto bytes = pixels ? pelo::checked_mul(*pixels, size) : std::nullopt;
  pelo::OsBuffer<uint8_t> turned;
  if (!bytes || !turned.allocate(*bytes)) return 0;
  const auto* in = static_cast<const uint8_t*>(buffer);
  for (size_t r = 0; r < h; ++r) {
    for (size_t c = 0; c < w; ++c, in += size) {
      const size_t to = clockwise ? c * h + (h - 1 - r) : (w - 1 - c) * h + r;
      std::memcpy(turned.data() + to * size, in, size);
    }
  }
  std::memcpy(buffer, turned.data(), *bytes);
  return 1;
}

}  // namespace

int decode(TAVIRPELO_DECINFO* decInfo, void* outBuffer, int reqWidth, int reqHeight) {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
  if (decInfo == nullptr || outBuffer == nullptr) {
    record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NULL);
    return 0;
  }
  if (reqWidth < 1 || reqHeight < 1) {
    refuse(Reason::kArgument, "JPEG decoder", "the requested size");
    log_error("TAVIRPELO_DecodeJPEG : Invalid Size");
    return 0;
  }
  BufferedSource source;
  if (!open_source(*decInfo, source)) return 0;
  if (decode(*decInfo, *source.get(), {outBuffer, reqWidth, reqHeight})) return 1;
  log_error("TAVIRPELO_DecodeJPEG : decode Fail");
  return 0;
}

int decode_thumbnail(TAVIRPELO_DECINFO* decInfo, void* outBuffer, int reqWidth, int reqHeight,
                     int* outWidth, int* outHeight) {
  if (decInfo == nullptr || outBuffer == nullptr || outWidth == nullptr || outHeight == nullptr)
    return 0;
  *outWidth = *outHeight = 0;
  if (reqWidth < 1 || reqHeight < 1) return 0;
  BufferedSource source;
  if (!open_source(*decInfo, source)) return 0;
  const PELOJ_THUMBNAIL thumbnail = scan_header(*source.get()).thumbnail;
  if (thumbnail_in_source(thumbnail, source->size)) {
    decInfo->option = (decInfo->option & ~0xF00u) | TAVIRPELO_FIT_TIGHT;
    if (decode_at(*decInfo, *source.get(), thumbnail.offset, thumbnail.width, thumbnail.height,
                  {outBuffer, reqWidth, reqHeight})) {
      return produced_size(decInfo, outWidth, outHeight);
    }
  }
  log_error("TAVIRPELO_DecodeJPEG : decode Fail");
  return 0;
}

int produced_size(const TAVIRPELO_DECINFO* decInfo, int* width, int* height) {
  *width = decInfo->outWidth;
  *height = decInfo->outHeight;
  return 1;
}

int rotate_buffer_90(void* buffer, int width, int height, int outFormat) {
  return rotate(buffer, width, height, outFormat, true);
}

int rotate_buffer_270(void* buffer, int width, int height, int outFormat) {
  return rotate(buffer, width, height, outFormat, false);
}

}  // namespace pelo::jpeg
