// The peer: libjpeg-turbo through its TurboJPEG interface, one handle for the program.
#include "bench/peer.h"

namespace bench::peer {
namespace {

struct HandleDeleter {
  void operator()(void* handle) const { tjDestroy(handle); }
};
using Handle = std::unique_ptr<void, HandleDeleter>;

tjhandle decompressor() {
  static const Handle handle(tjInitDecompress());
  return handle.get();
}

tjhandle compressor() {
  static const Handle handle(tjInitCompress());
  return handle.get();
}

// The two source positions of an output sample and the weight of the second, in 256ths.
struct Tap {
  size_t first, second;
  int weight;
};

Tap tap(int i, int from, int to) {
  int64_t at = (2 * int64_t{i} + 1) * from * 128 / to - 128;
  if (at < 0) at = 0;
  auto first = static_cast<size_t>(at / 256);
  size_t last = static_cast<size_t>(from) - 1;
  return {first, first < last ? first + 1 : last, static_cast<int>(at % 256)};
}

int mix(int a, int b, int weight) {
  return a * (256 - weight) + b * weight;
}

}  // namespace

Size size_of(const Bytes& jpeg) {
  Size size;
  int subsampling = 0;
  int colourSpace = 0;
  tjDecompressHeader3(decompressor(), jpeg.data(), jpeg.size(), &size.width, &size.height, &subsampling,
                      &colourSpace);
  return size;
}

bool decode(const Bytes& jpeg, Size scaled, TJPF format, int flags, uint8_t* pixels) {
  return tjDecompress2(decompressor(), jpeg.data(), jpeg.size(), pixels, scaled.width, 0, scaled.height,
                       format, flags) == 0;
}

unsigned long encode(const uint8_t* rgb, Size size, int quality, int flags) {
  unsigned char* jpeg = nullptr;
  unsigned long bytes = 0;
  int result = tjCompress2(compressor(), rgb, size.width, 0, size.height, TJPF_RGB, &jpeg, &bytes,
                           TJSAMP_420, quality, flags);
  tjFree(jpeg);
  return result == 0 ? bytes : 0;
}

bool transform(const Bytes& jpeg, int operation, int options, Bytes* result) {
  const Handle handle(tjInitTransform());
  tjtransform wanted{};
  wanted.op = operation;
  wanted.options = options;
  unsigned char* out = nullptr;
  unsigned long size = 0;
  const bool done = tjTransform(handle.get(), jpeg.data(), jpeg.size(), 1, &out, &size, &wanted, 0) == 0;
  if (done && result != nullptr) result->assign(out, out + size);
  tjFree(out);
  return done;
}

Size scale_at_least(Size size, int width) {
  for (int eighths = 1; eighths < 8; ++eighths) {
    const Size scaled = size.scaled(eighths);
    if (scaled.width >= width) return scaled;
  }
  return size;
}

void reduce(const uint8_t* from, Size fromSize, uint8_t* to, Size toSize) {
  std::vector<Tap> columns;
  for (int x = 0; x < toSize.width; ++x) columns.push_back(tap(x, fromSize.width, toSize.width));
  size_t stride = static_cast<size_t>(fromSize.width) * 3;
  for (int y = 0; y < toSize.height; ++y) {
    Tap row = tap(y, fromSize.height, toSize.height);
    const uint8_t* upper = from + row.first * stride;
    const uint8_t* lower = from + row.second * stride;
    for (const Tap& column : columns) {
      for (size_t c = 0; c < 3; ++c) {
        int above = mix(upper[column.first * 3 + c], upper[column.second * 3 + c], column.weight);
        int below = mix(lower[column.first * 3 + c], lower[column.second * 3 + c], column.weight);
        *to++ = static_cast<uint8_t>((mix(above, below, row.weight) + 0x8000) >> 16);
      }
    }
  }
}

}  // namespace bench::peer
