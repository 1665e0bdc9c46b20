// The given names of this room; each forwards to the room's own function.
#include "codec/formats/png/png_abi.h"

#include "codec/base/errors.h"
#include "codec/base/os_memory.h"
#include "codec/pixel/paint.h"
#include "codec/pixel/quad_sampler.h"
#include "tavirpelo/api.h"
#include "tavirpelo/decinfo.h"
#include "tavirpelo/decode.h"
#include "tavirpelo/io.h"

namespace png = pelo::png;
using namespace png;
using pelo::begin_operation;

uint32_t __PELOI_PngCrc32(const uint8_t* data, uint32_t length) {
  return png::crc32(data, length);
}

const uint32_t* __PELOI_PngBuildHuffmanTable(const uint8_t* lengths, int count, int alphabet,
                                             PELOI_PNGHUFFMANPOOL* pool) {
  return png::build_table(lengths, count, alphabet, pool);
}

void PELOI_FreePNGHuffmanMemory(PELOI_PNGHUFFMANPOOL** pool) {
  png::free_table(pool);
}

void __PELOI_PngReadFilterRow(PELOI_PNGCONTEXT* context, uint8_t* row, const uint8_t* previousRow,
                              size_t rowBytes) {
  png::unfilter_row(context, row, previousRow, rowBytes);
}

void __PELOI_PngWriteDataToOutputBuffer(PELOI_PNGCONTEXT* context) {
  png::write_output_row(context);
}

int __PELOI_WriteOutputDataFromINTBuffer(PELOI_PNGCONTEXT* context) {
  return png::write_gathered_image(context);
}

uint32_t getPassRowBytes(PELOI_PNGCONTEXT* context, uint32_t fullWidth, uint32_t fullHeight, int pass) {
  return png::set_pass_size(context, fullWidth, fullHeight, pass);
}

int __checkbuffer_util1_multiPELOI_IDAT(PELOI_PNGCONTEXT* context, PELOI_PNGREADBUFFER* buffer,
                                        uint32_t entryIndex) {
  return png::refill_from_chunks(context, buffer, entryIndex);
}

int _PELOI_PngInflateZStreamData(PELOI_PNGCONTEXT* context, uint32_t* total) {
  return png::inflate_memory(context, total);
}

int _PELOI_PngInflateZStreamData_streamming(PELOI_PNGCONTEXT* context, uint32_t* total) {
  return png::inflate_stream(context, total);
}

int _PELOI_PngInflateZStreamDataInterlaced(PELOI_PNGCONTEXT* context, uint32_t* total) {
  return png::inflate_interlaced_memory(context, total);
}

int _PELOI_PngInflateZStreamDataInterlaced_streamming(PELOI_PNGCONTEXT* context, uint32_t* total) {
  return png::inflate_interlaced_stream(context, total);
}

int PELOI_FastImgDecodePng(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines) {
  return png::decode_request(decInfo, output, width, height, lines);
}

int PELOI_DestroyDecodePng(TAVIRPELO_DECINFO* decInfo) {
  return png::release(decInfo);
}

int PELOI_GetAlphaTrFlag(TAVIRPELO_DECINFO* decInfo) {
  return png::needs_alpha(decInfo);
}

int __PELOI_PngParserMain(PELOI_PNGINFO* info, PELOI_PNGREADBUFFER* buffer) {
  return png::parse_chunks(info, buffer);
}

int __PELOI_PngParseTRNSbKGd(PELOI_PNGINFO* info, PELOI_PNGREADBUFFER* buffer, uint32_t length,
                             uint32_t unused3, std::array<uint16_t, 3>* colourKey) {
  return png::parse_transparency(info, buffer, length, unused3, colourKey);
}

uint32_t __PELOI_PngGetUINT32(const uint8_t* bytes) {
  return png::load_uint32(bytes);
}

int __checkbuffer_util1(PELOI_PNGREADBUFFER* buffer, uint32_t need) {
  return png::refill_empty(buffer, need);
}

int __checkbuffer_util2(PELOI_PNGREADBUFFER* buffer, uint32_t need) {
  return png::refill_behind(buffer, need);
}

int TAVIRPELOI_DecodePNG(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  begin_operation();
  return png::decode(decInfo, output, width, height);
}

int TAVIRPELOI_DecodePNGLine(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height,
                             int lines) {
  begin_operation();
  return png::decode_lines(decInfo, output, width, height, lines);
}

int TAVIRPELOI_DecodePNGIter(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  begin_operation();
  return png::decode_step(decInfo, output, width, height);
}

int TAVIRPELOI_DestroyPNGInfo(TAVIRPELO_DECINFO* decInfo) {
  return png::end_decode(decInfo);
}

int TAVIRPELOI_AbortPNGIter(TAVIRPELO_DECINFO* decInfo) {
  return png::abort(decInfo);
}

// ---- without a caller in the library ----

namespace {

// The four samples of each output column.
template <size_t Channels, class Write>
void resize_row(const uint8_t* upper, const uint8_t* lower, uint32_t sourceWidth, uint32_t outWidth,
                uint8_t* output, Write write) {
  if (sourceWidth == 0 || outWidth == 0) return;
  pelo::QuarterPoints columns(sourceWidth, outWidth);
  for (uint32_t k = 0; k < outWidth; ++k, columns.advance()) {
    const size_t a = static_cast<size_t>(columns.first()) * Channels;
    const size_t b = static_cast<size_t>(columns.second()) * Channels;
    const uint8_t* const samples[4] = {upper + a, upper + b, lower + a, lower + b};
    write(samples, output + k * Channels);
  }
}

template <size_t Channels>
void write_average(const uint8_t* const (&samples)[4], uint8_t* out) {
  for (size_t c = 0; c < Channels; ++c) {
    uint32_t sum = 0;
    for (const uint8_t* sample : samples) sum += uint32_t{sample[c]} >> 2;
    out[c] = static_cast<uint8_t>(sum);
  }
}

}  // namespace

void __PELOI_PngFreeTextList(PELOI_PNGTEXT* head) {
  while (head != nullptr) {
    PELOI_PNGTEXT* const next = head->next;
    pelo::os_free(head->text);
    pelo::os_free(head);
    head = next;
  }
}

PELOI_PNGTRINFO* PELOI_FastImgCreatePngTrInfo(void) {
  return pelo::os_new<PELOI_PNGTRINFO>().release();
}

void PELOI_FastImgDestroyPngTrInfo(PELOI_PNGTRINFO* info) {
  if (info == nullptr) return;
  if (info->ownsBlock != 0) pelo::os_free(info->block);
  pelo::os_free(info);
}

uint32_t __PELOI_PngReadBits(const uint8_t* bytes, uint32_t bytePosition, uint32_t bitPosition,
                             uint32_t count) {
  uint32_t value = 0;
  for (uint32_t i = 0; i < count && i < 32; ++i) {
    const uint64_t bit = uint64_t{bitPosition} + i;
    value |= (uint32_t{bytes[bytePosition + bit / 8]} >> (bit % 8) & 1) << i;
  }
  return value;
}

int __PELOI_NearestInterpolateOutput(PELOI_PNGCONTEXT*, void*, uint32_t, uint32_t) {
  return 1;
}

void __PELOI_PngResize_32bit(const PELOI_PNGCONTEXT*, const uint8_t* upper, const uint8_t* lower,
                             uint32_t sourceWidth, uint32_t outWidth, uint8_t* output) {
  resize_row<4>(upper, lower, sourceWidth, outWidth, output, write_average<4>);
}

void __PELOI_PngResize_24bit(const PELOI_PNGCONTEXT*, const uint8_t* upper, const uint8_t* lower,
                             uint32_t sourceWidth, uint32_t outWidth, uint8_t* output) {
  resize_row<3>(upper, lower, sourceWidth, outWidth, output, write_average<3>);
}

void __PELOI_PngResize_24bit_TR(const PELOI_PNGCONTEXT* context, const uint8_t* upper,
                                const uint8_t* lower, uint32_t sourceWidth, uint32_t outWidth,
                                uint8_t* output) {
  const auto& key = context->info.colourKey;
  const auto write = [&key](const uint8_t* const(&samples)[4], uint8_t* out) {
    const uint8_t* kept[4];
    size_t count = 0;
    for (const uint8_t* s : samples) {
      if (s[0] != key[0] || s[1] != key[1] || s[2] != key[2]) kept[count++] = s;
    }
    if (count == 0) return;
    const uint8_t* const filled[4] = {kept[0], kept[1 % count], kept[2 % count], kept[3 % count]};
    write_average<3>(filled, out);
  };
  resize_row<3>(upper, lower, sourceWidth, outWidth, output, write);
}

uint8_t APPLY_ALPHA_BYTE_TO_BYTE(uint32_t foreground, uint32_t alpha, uint32_t background) {
  return pelo::blend_channel(foreground & 255, alpha & 255, background & 255);
}

uint16_t APPLY_ALPHA_RGB_TO_SHORT(uint32_t red, uint32_t green, uint32_t blue, uint32_t alpha,
                                  uint32_t background565) {
  return pelo::blend_rgb565(red & 255, green & 255, blue & 255, alpha & 255, background565);
}
