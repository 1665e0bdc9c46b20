// Encoding of a whole image into memory or a file.
#include <algorithm>

#include "codec/base/errors.h"
#include "codec/base/os.h"
#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {
namespace {

bool has_pixels(const TAVIRPELO_RAWINFO* image) {
  return image != nullptr && image->pData != nullptr;
}

bool encode_rows(ELO_ENCODER* encoder) {
  if (!write_headers(encoder)) return false;
  while (encoder->row < encoder->height) {
    if (!encode_next_row(encoder)) return false;
  }
  return flush_bits(encoder) && write_end_mark(encoder);
}

bool encode(const TAVIRPELO_RAWINFO* image, ELO_DESTINATION& destination,
            const TAVIRPELO_ENCOPTION* options) {
  if (!has_pixels(image) || options == nullptr) return false;
  const pelo::OsPtr<ELO_ENCODER> encoder(make_encoder(image, &destination, options, nullptr));
  if (encoder == nullptr) return false;
  const bool done = encode_rows(encoder.get());
  release_buffers(encoder.get());
  return done;
}

}  // namespace

int encode_to_buffer(const TAVIRPELO_RAWINFO* image, uint8_t** buffer, int* size,
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

int encode_to_file(const TAVIRPELO_RAWINFO* image, const char* path,
                   const TAVIRPELO_ENCOPTION* options) {
  FILE* file = os_open(path, "wb");
  if (file == nullptr) return refuse(Reason::kNotWritable, "opening the output");
  ELO_DESTINATION destination{ELO_TO_FILE, 0, 0, 0, file, nullptr};
  const bool done = encode(image, destination, options);
  // The last bytes may reach the disk only now.
  const bool closed = os_close(file) == 0;
  return (done && closed) || refuse(Reason::kNotWritable, "closing the output");
}

}  // namespace pelo::jpeg
