// Encoding of a whole image into memory or a file.
#include <algorithm>

#include "codec/formats/jpeg/encoder/encoder.h"

using namespace pelo::jpeg;

namespace {

int missing_argument() {
  debug_PeloCodecError = TAVIRPELO_CODEC_ARGUMENT;
  return 0;
}

bool has_pixels(const TAVIRPELO_RAWINFO* image) {
  return image != nullptr && image->pData != nullptr;
}

bool encode_rows(ELO_ENCODER* encoder) {
  if (!__elo_jpeg_enc_make_header(encoder)) return false;
  while (encoder->row < encoder->height) {
    if (!__elo_jpeg_enc_process_image_data(encoder)) return false;
  }
  return __elo_jpeg_enc_finish_compression(encoder) && __elo_jpeg_enc_make_end_mark(encoder);
}

bool encode(const TAVIRPELO_RAWINFO* image, ELO_DESTINATION& destination,
            const TAVIRPELO_ENCOPTION* options) {
  if (!has_pixels(image) || options == nullptr) return false;
  const pelo::OsPtr<ELO_ENCODER> encoder(
      __elo_jpeg_enc_initiaize(image, &destination, options, nullptr));
  if (encoder == nullptr) return false;
  const bool done = encode_rows(encoder.get());
  __elo_jpeg_enc_release_mem(encoder.get());
  return done;
}

}  // namespace

int elo_enc_jpeg_to_buffer_ex(const TAVIRPELO_RAWINFO* image, uint8_t** buffer, int* size,
                              const TAVIRPELO_ENCOPTION* options) {
  if (buffer == nullptr || size == nullptr) return 0;
  const int capacity = *buffer != nullptr ? std::max(*size, 0) : 0;
  ELO_DESTINATION destination{ELO_TO_MEMORY, capacity, 0, 0, nullptr, *buffer};
  const bool done = encode(image, destination, options);
  if (!done) discard(destination);
  *buffer = destination.buffer;
  *size = destination.total;
  return done;
}

int elo_enc_jpeg_to_file_ex(const TAVIRPELO_RAWINFO* image, const char* path,
                            const TAVIRPELO_ENCOPTION* options) {
  FILE* file = TAVIRPELO_OsFopen(path, "wb");
  if (file == nullptr) return 0;
  ELO_DESTINATION destination{ELO_TO_FILE, 0, 0, 0, file, nullptr};
  const bool done = encode(image, destination, options);
  // The last bytes may reach the disk only now.
  const bool closed = TAVIRPELO_OsFclose(file) == 0;
  return done && closed;
}

int elo_enc_jpeg_to_buffer(const TAVIRPELO_RAWINFO* image, uint8_t** buffer, int* size, int quality) {
  const TAVIRPELO_ENCOPTION options{quality, nullptr, 0};
  return elo_enc_jpeg_to_buffer_ex(image, buffer, size, &options);
}

int elo_enc_jpeg_to_file(const TAVIRPELO_RAWINFO* image, const char* path, int quality) {
  const TAVIRPELO_ENCOPTION options{quality, nullptr, 0};
  return elo_enc_jpeg_to_file_ex(image, path, &options);
}

int TAVIRPELO_EncodeJpegToBuffer(const TAVIRPELO_RAWINFO* image, uint8_t** buffer, int* size,
                                 int quality) {
  if (!has_pixels(image) || buffer == nullptr || *buffer == nullptr || size == nullptr) {
    return missing_argument();
  }
  return elo_enc_jpeg_to_buffer(image, buffer, size, std::clamp(quality, 1, 100));
}

int TAVIRPELO_EncodeJpegToFile(const TAVIRPELO_RAWINFO* image, const char* path, int quality) {
  if (!has_pixels(image) || path == nullptr) return missing_argument();
  return elo_enc_jpeg_to_file(image, path, std::clamp(quality, 1, 100));
}
