// Several threads with objects of their own: each gets what it gets alone, and its own account of a
// failure. The thread sanitizer looks on.
#include <array>
#include <functional>
#include <thread>

#include "tests/support/failures.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/samples.h"

namespace tests {
namespace {

constexpr int kWidth = 60, kHeight = 40;

// All the bytes that a piece of work produces.
using Work = std::function<Bytes()>;

Bytes run(const Entry& e, Bytes file, const Request& r) {
  const DecInfo d = open_memory(file, r.format, r.option);
  GuardedPixels pixels(r.width, r.height, r.format);
  Bytes bytes{static_cast<uint8_t>(e.run(d.get(), pixels.data(), r))};
  append(bytes, pixels.content());
  return bytes;
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
  std::vector<Work> work{
      shown,
      [] { return encode_own(kWidth, kHeight, 80); },
  };
  for (const Entry& e : entries()) {
    // Zooms share their polling state.
    if (e.name == std::string_view("jpeg_zoomed")) continue;
    for (const Sample& sample : samples()) {
      if (!sample.reads(e)) continue;
      for (const Request& r : {sample.whole(), Request{17, 26, 0, TAVIRPELO_FIT_STRETCH, 26}})
        work.push_back([=] { return run(e, sample.file, r); });
    }
  }
  return work;
}

using Threads = QuietTest;

// Runs task(thread's number) on four threads at once.
void on_threads(const std::function<void(size_t)>& task) {
  std::array<std::thread, 4> threads;
  for (size_t i = 0; i < threads.size(); ++i) threads[i] = std::thread(task, i);
  for (std::thread& thread : threads) thread.join();
}

TEST_F(Threads, EachGetsWhatItGetsAlone) {
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
TEST_F(Threads, EachHasItsOwnFailure) {
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
