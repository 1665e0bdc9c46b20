// A fuzz target over every entry of the codec that takes foreign bytes. The first eight bytes of an
// input choose the entry, output format, size and options; the rest is the file.
#include <vector>

#if __has_include(<sanitizer/msan_interface.h>)
#include <sanitizer/msan_interface.h>
#endif

#include "codec/pixel/row_stores.h"
#include "platform/android_log.h"
#include "tests/support/entries.h"

namespace {

// Under the memory sanitizer: no byte of a result comes from memory that was never set.
void check_set([[maybe_unused]] const std::vector<uint8_t>& bytes) {
#if __has_feature(memory_sanitizer)
  __msan_check_mem_is_initialized(bytes.data(), bytes.size());
#endif
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  constexpr size_t kHead = 8;
  if (size <= kHead) return 0;
  pelo::platform::set_log_sink([](const char*) {});
  constexpr int kFormats[] = {0, 1, 5, 6, 7, 8, 10, 11};
  const tests::Request r{1 + data[2] % 100,     1 + data[3] % 100,
                         kFormats[data[1] % 8], (data[4] | data[5] << 8) & 0x37FFu,
                         1 + data[6] % 40,      data[7] % 5};
  // Blocks of exactly the right sizes: any byte beyond is noticed.
  std::vector<uint8_t> file(data + kHead, data + size);
  std::vector<uint8_t> pixels(static_cast<size_t>(r.width) * static_cast<size_t>(r.height) *
                              static_cast<size_t>(pelo::bytes_per_pixel(r.format)));
  tests::repair_checksums(file);  // mutations would stop at the first of them
  TAVIRPELO_DECINFO* d = TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, file.data(),
                                                 static_cast<int>(file.size()), r.format, r.option);
  if (d == nullptr) return 0;
  TAVIRPELO_SetDecMode(d, r.mode);
  tests::entries()[data[0] % tests::entries().size()].run(d, pixels.data(), r);
  check_set(pixels);
  TAVIRPELOI_AbortPNGIter(d);
  TAVIRPELOI_AborAGIF(d);
  TAVIRPELOI_AbortBMPIter(d);
  TAVIRPELO_DestroyDecInfo(d);
  return 0;
}
