#include "codec/jpeg/encoder/encoder.h"

#include <algorithm>

using namespace pelo;
using namespace pelo::jpeg;

namespace {

constexpr int kFileBuffer = 4096;

struct Release {
  void operator()(ELO_ENCODER* encoder) const { __elo_jpeg_enc_release_mem(encoder); }
};
using Encoder = std::unique_ptr<ELO_ENCODER, Release>;

bool refuse(int code) {
  elo_SetError(code);
  return false;
}

bool set_image(ELO_ENCODER& encoder, const TAVIRPELO_RAWINFO& image) {
  if (image.width < 1 || image.height < 1 || image.width > kEncoderMaxSide ||
      image.height > kEncoderMaxSide) {
    return refuse(kBadSize);
  }
  encoder.width = static_cast<int>(image.width);
  encoder.height = static_cast<int>(image.height);
  encoder.format = static_cast<int>(image.format);
  switch (image.format) {
    case TAVIRPELO_RGB565:
    case TAVIRPELO_RGB888:
    case TAVIRPELO_YUV420: encoder.componentCount = 3; return true;
    case TAVIRPELO_GREY8: encoder.componentCount = 1; return true;
    default: return refuse(kBadFormat);
  }
}

int divide_up(int a, int b) { return (a + b - 1) / b; }

// Y 2 x 2, Cb and Cr 1 x 1; a grey picture's one component 1 x 1.
bool lay_out(ELO_ENCODER& encoder) {
  encoder.hMax = encoder.vMax = encoder.componentCount > 1 ? 2 : 1;
  encoder.mcusWide = divide_up(encoder.width, 8 * encoder.hMax);
  encoder.mcusHigh = divide_up(encoder.height, 8 * encoder.vMax);
  encoder.mcuBlocks = 0;
  for (int c = 0; c < encoder.componentCount; ++c) {
    EncoderComponent& component = encoder.components[static_cast<size_t>(c)];
    component.id = c + 1;
    component.h = component.v = c == 0 ? encoder.hMax : 1;
    component.table = c == 0 ? 0 : 1;
    component.width = divide_up(encoder.width * component.h, encoder.hMax);
    component.height = divide_up(encoder.height * component.v, encoder.vMax);
    component.blocksWide = divide_up(component.width, 8);
    component.blocksHigh = divide_up(component.height, 8);
    component.stride = encoder.mcusWide * component.h * 8;
    encoder.mcuBlocks += component.h * component.v;
    const auto samples = static_cast<size_t>(component.stride) * static_cast<size_t>(8 * component.v);
    if (!component.samples.allocate(samples)) return refuse(kNoMemory);
  }
  return encoder.mcuBlocks <= kEncoderMaxBlocks || refuse(kBadSampling);
}

// The whole stream into the destination.
bool encode(const TAVIRPELO_RAWINFO& image, ELO_DESTINATION& destination,
            const TAVIRPELO_ENCOPTION& options) {
  const Encoder encoder(__elo_jpeg_enc_initiaize(&image, &destination, &options, nullptr));
  if (!encoder || !__elo_jpeg_enc_make_header(encoder.get())) return false;
  while (encoder->mcuRow < encoder->mcusHigh) {
    if (!__elo_jpeg_enc_process_image_data(encoder.get(), image.pData)) return false;
  }
  return __elo_jpeg_enc_finish_compression(encoder.get()) != 0;
}

bool write_rest(ELO_DESTINATION& destination) {
  const auto used = static_cast<size_t>(destination.used);
  return TAVIRPELO_OsFwrite(destination.buffer, 1, used, destination.file) == used;
}

bool missing(const TAVIRPELO_RAWINFO* image) { return image == nullptr || image->pData == nullptr; }

int argument_error() {
  debug_PeloCodecError = TAVIRPELO_CODEC_ARGUMENT;
  return 0;
}

}  // namespace

void elo_SetError(int) {}

ELO_ENCODER* __elo_jpeg_enc_initiaize(const TAVIRPELO_RAWINFO* image, ELO_DESTINATION* destination,
                                      const TAVIRPELO_ENCOPTION* options,
                                      const ELO_ENCPARAMETERS* parameters) {
  if (missing(image) || destination == nullptr || parameters != nullptr) return nullptr;
  Encoder encoder(os_new<ELO_ENCODER>().release());
  if (!encoder) return elo_SetError(kNoMemory), nullptr;
  if (!set_image(*encoder, *image) || !lay_out(*encoder)) return nullptr;
  encoder->destination = destination;
  encoder->app1 = options != nullptr ? options->app1 : nullptr;
  __elo_jpeg_enc_set_quality(encoder.get(), options != nullptr ? options->quality : 0);
  __elo_jpeg_enc_prepare_huffman_code(encoder.get());
  return encoder.release();
}

void __elo_jpeg_enc_release_mem(ELO_ENCODER* encoder) { OsDelete()(encoder); }

int elo_enc_jpeg_to_buffer_ex(const TAVIRPELO_RAWINFO* image, uint8_t** buffer, int* size,
                              const TAVIRPELO_ENCOPTION* options) {
  ELO_DESTINATION destination{1, *size, 0, 0, nullptr, *buffer};
  const bool done = encode(*image, destination, *options);
  if (!done) {
    TAVIRPELO_OsFree(destination.buffer);
    destination.buffer = nullptr;
    destination.used = 0;
  }
  *buffer = destination.buffer;
  *size = destination.used;
  return done;
}

int elo_enc_jpeg_to_file_ex(const TAVIRPELO_RAWINFO* image, const char* path,
                            const TAVIRPELO_ENCOPTION* options) {
  OsBuffer<uint8_t> working;
  if (!working.allocate(kFileBuffer)) return elo_SetError(kNoMemory), 0;
  FILE* file = TAVIRPELO_OsFopen(path, "wb");
  if (file == nullptr) return 0;
  ELO_DESTINATION destination{0, kFileBuffer, 0, 0, file, working.release()};
  const bool written = encode(*image, destination, *options) && write_rest(destination);
  TAVIRPELO_OsFree(destination.buffer);
  return TAVIRPELO_OsFclose(file) == 0 && written;
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
  if (missing(image) || buffer == nullptr || *buffer == nullptr || size == nullptr) return argument_error();
  return elo_enc_jpeg_to_buffer(image, buffer, size, std::clamp(quality, 1, 100));
}

int TAVIRPELO_EncodeJpegToFile(const TAVIRPELO_RAWINFO* image, const char* path, int quality) {
  if (missing(image) || path == nullptr) return argument_error();
  return elo_enc_jpeg_to_file(image, path, std::clamp(quality, 1, 100));
}

ELO_ENCODER* elo_jpeg_enc_mcu_init(const TAVIRPELO_RAWINFO* image, ELO_DESTINATION* destination,
                                   const TAVIRPELO_ENCOPTION* options,
                                   const ELO_ENCPARAMETERS* parameters) {
  Encoder encoder(__elo_jpeg_enc_initiaize(image, destination, options, parameters));
  if (!encoder || !__elo_jpeg_enc_make_header(encoder.get())) return nullptr;
  return encoder.release();
}

int elo_jpeg_enc_muc_process(ELO_ENCODER* encoder, const uint8_t* band, int* position) {
  if (encoder == nullptr || band == nullptr || encoder->mcuRow >= encoder->mcusHigh) return 0;
  const auto width = static_cast<size_t>(encoder->width);
  const uint8_t* cb = band + 16 * width;
  const uint8_t* planes[3] = {band, cb, cb + (width + 1) / 2 * 8};
  __elo_jpeg_enc_get_raw_data(encoder, planes, 16);
  const int coded = __elo_jpeg_enc_compress_data(encoder);
  if (position != nullptr) *position = std::min(encoder->mcuRow * 8 * encoder->vMax, encoder->height);
  return coded;
}

int elo_jpeg_enc_mcu_finish(ELO_ENCODER* encoder, uint8_t** buffer, int* size) {
  if (encoder == nullptr) return 0;
  const Encoder owned(encoder);
  const int finished = __elo_jpeg_enc_finish_compression(encoder);
  const ELO_DESTINATION& destination = *encoder->destination;
  if (buffer != nullptr) *buffer = destination.buffer;
  if (size != nullptr) *size = static_cast<int>(destination.total + destination.used);
  return finished;
}
