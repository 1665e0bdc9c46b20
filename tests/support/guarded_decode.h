// Decoder objects over bytes from every kind of source, and output buffers with guard bytes around them.
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "codec/pixel/row_stores.h"
#include "tavirpelo/tavirpelo.h"
#include "tests/support/memory_stream.h"
#include "tests/support/pixels.h"
#include "tests/support/slideshow_files.h"

namespace tests {

constexpr uint8_t kGuard = 0xA5;
constexpr size_t kGuardBytes = 64;

inline size_t bytes_of(int format, int width, int height) {
  const size_t pixels = static_cast<size_t>(width) * static_cast<size_t>(height);
  const int chroma = 2 * ((width + 1) / 2) * ((height + 1) / 2);
  if (format == TAVIRPELO_YUV420) return pixels + static_cast<size_t>(chroma);
  return pixels * static_cast<size_t>(pelo::bytes_per_pixel(format));
}

// A buffer of width x height pixels, filled with a value, whose surroundings are checked at its end.
class GuardedPixels {
 public:
  GuardedPixels(int width, int height, int format, uint8_t fill = kFill)
      : size_(bytes_of(format, width, height)), bytes_(kGuardBytes, kGuard) {
    append(bytes_, Bytes(size_, fill));
    append(bytes_, Bytes(kGuardBytes, kGuard));
  }
  ~GuardedPixels() {
    for (size_t i = 0; i < kGuardBytes; ++i) {
      EXPECT_EQ(kGuard, bytes_[i]);
      EXPECT_EQ(kGuard, bytes_[kGuardBytes + size_ + i]);
    }
  }
  uint8_t* data() { return bytes_.data() + kGuardBytes; }
  Bytes content() { return Bytes(data(), data() + size_); }

 private:
  size_t size_;
  Bytes bytes_;
};

struct DecInfoDeleter {
  void operator()(TAVIRPELO_DECINFO* d) const { TAVIRPELO_DestroyDecInfo(d); }
};
using DecInfo = std::unique_ptr<TAVIRPELO_DECINFO, DecInfoDeleter>;

// `file` must outlive the object; its bytes may be rewritten.
inline DecInfo open_memory(Bytes& file, int format, uint32_t option = 0) {
  file.shrink_to_fit();  // reads past the end are seen
  return DecInfo(TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, file.data(), static_cast<int>(file.size()),
                                         format, option));
}
inline DecInfo open_stream(MemoryStream& stream, int format, uint32_t option = 0) {
  return DecInfo(TAVIRPELO_CreateDecInfoWithStream(&stream, static_cast<int>(stream.bytes.size()),
                                                   stream_read, stream_skip, stream_reset, format,
                                                   option));
}
inline DecInfo open_file(const std::string& path, int format, uint32_t option = 0) {
  return DecInfo(
      TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_FILE, const_cast<char*>(path.c_str()), 0, format, option));
}

// use(object) for the same bytes in memory, in a file, and from streams that deliver at most `limits`
// bytes a read.
template <class Use>
void from_every_source(Bytes file, int format, uint32_t option, Use use,
                       std::initializer_list<int> limits = {INT_MAX}) {
  {
    SCOPED_TRACE("memory");
    use(open_memory(file, format, option).get());
  }
  {
    SCOPED_TRACE("file");
    const TempFile onDisk;
    onDisk.write(file);
    use(open_file(onDisk.path(), format, option).get());
  }
  for (const int limit : limits) {
    SCOPED_TRACE(limit);
    MemoryStream stream{.bytes = file, .limit = limit};
    use(open_stream(stream, format, option).get());
  }
}

// Decoding in one call.
using Decoder = int (*)(TAVIRPELO_DECINFO*, void*, int, int);
struct Decode {
  int answer = 0;
  Bytes pixels;
  int outWidth = 0, outHeight = 0;
};
inline Decode decode(Decoder decoder, TAVIRPELO_DECINFO* info, int width, int height) {
  if (info == nullptr) return {};
  GuardedPixels pixels(width, height, info->outFormat);
  const int answer = decoder(info, pixels.data(), width, height);
  EXPECT_EQ(nullptr, info->pFormatInfo);
  return {answer, pixels.content(), info->outWidth, info->outHeight};
}
inline Decode decode(Decoder decoder, Bytes file, int width, int height, int format,
                     uint32_t option = 0) {
  return decode(decoder, open_memory(file, format, option).get(), width, height);
}

}  // namespace tests
