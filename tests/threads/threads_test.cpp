// Several threads with objects of their own: each gets what it gets alone, and its own account of a
// failure. The thread sanitizer looks on.
#include <array>
#include <functional>
#include <thread>

#include "tests/support/gif_builder.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/png_builder.h"

namespace tests {
namespace {

constexpr int kWidth = 60, kHeight = 40;

Bytes bmp_file() {
  ByteWriter head(false);
  head.text("BM").u32(54 + kWidth * kHeight * 3).u32(0).u32(54).u32(40).u32(kWidth).u32(kHeight);
  Bytes file = head.u16(1).u16(24).block(Bytes(24));
  append(file, random_bytes(kWidth * kHeight * 3, 3));
  return file;
}

Bytes wbmp_file() {
  Bytes file{0, 0, kWidth, kHeight};
  append(file, random_bytes((kWidth + 7) / 8 * kHeight, 4));
  return file;
}

Bytes animation() {
  GifFile gif = sample_gif(kWidth, kHeight, 4);
  for (int i = 0; i < 3; ++i) gif.images.push_back(gif.images.front());
  return gif.bytes();
}

// All the bytes that a piece of work produces.
using Work = std::function<Bytes()>;

Work decoding(Decoder decoder, const Bytes& file, int format, int width = kWidth, int height = kHeight) {
  return [=] { return decode(decoder, file, width, height, format).pixels; };
}

Bytes every_frame(Bytes file) {
  Bytes all;
  const DecInfo object = open_memory(file, TAVIRPELO_RGBA8888);
  for (int answer = 1; answer == 1;) {
    GuardedPixels pixels(kWidth, kHeight, TAVIRPELO_RGBA8888);
    answer = TAVIRPELOI_DecodeAGIF(object.get(), pixels.data(), kWidth, kHeight);
    append(all, pixels.content());
  }
  return all;
}

Bytes taken(uint8_t* buffer, int size, int answer) {
  Bytes bytes;
  if (answer == 1) bytes.assign(buffer, buffer + size);
  TAVIRPELO_OsFree(buffer);
  return bytes;
}

Bytes turned(Bytes jpeg) {
  ELO_DESTINATION to{ELO_TO_MEMORY, 0, 0, 0, nullptr, nullptr};
  const int answer =
      elo_rotate_jpeg(jpeg.data(), static_cast<int>(jpeg.size()), kWidth, kHeight, &to, 90, 1, nullptr);
  return taken(to.buffer, to.used, answer);
}

Bytes shrunk(Bytes jpeg) {
  int size = 1024;
  auto* buffer = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(1024));
  const int answer = TAVIRPELO_ReEncodeJpegToBuffer(jpeg.data(), static_cast<int>(jpeg.size()), 1,
                                                    &buffer, &size, 1500);
  return taken(buffer, size, answer);
}

// A show made, opened again and drawn. Its path stands in the file: only the pixels are compared.
Bytes shown() {
  const TempFile file(std::to_string(std::hash<std::thread::id>{}(std::this_thread::get_id())));
  {
    SlideShow show;
    EXPECT_EQ(1, show.CreateShow(file.c_str(), 480, 480));
    EXPECT_EQ(1, add_sample(show, kWidth, kHeight, "one"));
    EXPECT_EQ(1, add_sample(show, kHeight, kWidth, "two", 0));
  }
  SlideShow show;
  EXPECT_EQ(1, show.OpenShow(file.c_str(), 480, 480));
  Bytes pixels(kWidth * kHeight * 4);
  EXPECT_EQ(1, show.GetDrawble(1, pixels.data(), kWidth, kHeight));
  return pixels;
}

std::vector<Work> all_work() {
  const Bytes jpeg = sample_jpeg(kWidth, kHeight), pixels = sample_pixels(kWidth, kHeight);
  std::vector<Work> work{
      decoding(TAVIRPELO_DecodeJPEG, jpeg, TAVIRPELO_RGB888),
      decoding(TAVIRPELO_DecodeJPEG, jpeg, TAVIRPELO_RGB565_DITHER, 25, 17),
      decoding(TAVIRPELOI_DecodePNG, build_png(random_png_image(1, 6, 8, kWidth, kHeight, true, false)),
               7),
      decoding(TAVIRPELOI_DecodePNG, build_png(random_png_image(2, 3, 4, kWidth, kHeight, false, true)),
               1, 31, 9),
      decoding(TAVIRPELOI_DecodeGIF, sample_gif(kWidth, kHeight).bytes(), TAVIRPELO_RGB888, 20, 20),
      decoding(TAVIRPELOI_DecodeBMP, bmp_file(), TAVIRPELO_BGRA8888, 33, 22),
      decoding(TAVIRPELOI_DecodeWBMP, wbmp_file(), TAVIRPELO_RGB565, 33, 22),
      [file = animation()] { return every_frame(file); },
      [=] {
        return encode_pixels(pixels, kWidth, kHeight, TAVIRPELO_RGB888, {80, nullptr, 0});
      },
      [=] { return turned(jpeg); },
      [=] { return shrunk(jpeg); },
      shown,
  };
#ifdef TAVIR_HAVE_LIBJPEG
  work.push_back(
      decoding(TAVIRPELO_DecodeJPEG, encode_libjpeg(kWidth, kHeight, {.progressive = true}), 1));
#endif
  return work;
}

// Runs task(thread's number) on four threads at once.
void on_threads(const std::function<void(size_t)>& task) {
  std::array<std::thread, 4> threads;
  for (size_t i = 0; i < threads.size(); ++i) threads[i] = std::thread(task, i);
  for (std::thread& thread : threads) thread.join();
}

TEST(Threads, EachGetsWhatItGetsAlone) {
  const std::vector<Work> work = all_work();
  std::vector<Bytes> alone;
  for (const Work& item : work) alone.push_back(item());
  for (const Bytes& bytes : alone) EXPECT_FALSE(bytes.empty());
  on_threads([&](size_t thread) {
    for (size_t i = 0; i < 2 * work.size(); ++i) {
      const size_t item = (i + 3 * thread) % work.size();
      EXPECT_EQ(alone[item], work[item]()) << "work " << item << ", thread " << thread;
    }
  });
}

// The process-wide words may hold any thread's code; the account is the thread's own.
TEST(Threads, EachHasItsOwnFailure) {
  on_threads([](size_t thread) {
    for (int round = 0; round < 50; ++round) {
      TAVIRPELO_HINFO header;
      uint8_t picture[4];
      TAVIRPELO_ERROR error;
      if (thread % 2 == 0) {
        TAVIRPELO_ParseFromFile("no/such/picture.jpg", &header);
      } else {
        TAVIRPELO_ParseFromBuffer(picture, 0, &header);
      }
      EXPECT_EQ(1, TAVIRPELO_LastError(&error));
      EXPECT_EQ(thread % 2 == 0 ? TAVIRPELO_REASON_NOT_FOUND : TAVIRPELO_REASON_EMPTY, error.reason)
          << error.text;
    }
  });
}

}  // namespace
}  // namespace tests
