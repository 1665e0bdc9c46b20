// Decoder objects over bytes, and output buffers with guard bytes around them.
#pragma once

#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "codec/pixel/packers.h"
#include "tavirpelo/tavirpelo.h"
#include "tests/support/memory_stream.h"

namespace tests {

constexpr uint8_t kGuard = 0xA5;
constexpr size_t kGuardBytes = 64;

// A buffer of width x height pixels, filled with a value, whose surroundings are checked at its end.
class GuardedPixels {
 public:
  GuardedPixels(int width, int height, int format, uint8_t fill = 0x33)
      : size_(static_cast<size_t>(width) * static_cast<size_t>(height) *
              static_cast<size_t>(pelo::bytes_per_pixel(format))),
        bytes_(size_ + 2 * kGuardBytes, kGuard) {
    std::fill_n(data(), size_, fill);
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
  return DecInfo(TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, file.data(), static_cast<int>(file.size()),
                                         format, option));
}
inline DecInfo open_stream(MemoryStream& stream, int format, uint32_t option = 0) {
  return DecInfo(TAVIRPELO_CreateDecInfoWithStream(&stream, static_cast<int>(stream.bytes.size()),
                                                   stream_read, stream_skip, stream_reset, format,
                                                   option));
}
inline DecInfo open_file(const std::string& path, int format, uint32_t option = 0) {
  return DecInfo(TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_FILE, const_cast<char*>(path.c_str()), 0, format,
                                         option));
}

}  // namespace tests
