// Zooms whose picture is decoded by a real task, through a task layer of one thread.
#include "codec/zoom/task.h"

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <deque>
#include <mutex>
#include <thread>

#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

using Message = TAVIRPELO_TASKMESSAGE;

// One task at a time with its queue. Destroying sends it the message that ends its loop.
struct OneThread {
  std::thread thread;
  std::mutex mutex;
  std::condition_variable arrived;
  std::deque<Message> queue;
  TAVIRPELO_TASKFN entry = nullptr;
  int created = 0, destroyed = 0, priority = -1;
} tasks;

int create_task(int priority, TAVIRPELO_TASKFN entry) {
  tasks.priority = priority;
  tasks.entry = entry;
  return ++tasks.created;
}
int start_task(int) {
  tasks.thread = std::thread(tasks.entry);
  return 1;
}
int send_message(int, const Message* message) {
  const std::lock_guard lock(tasks.mutex);
  tasks.queue.push_back(*message);
  tasks.arrived.notify_one();
  return 1;
}
int receive_message(int timeout, Message* message) {
  EXPECT_EQ(-1, timeout);
  std::unique_lock lock(tasks.mutex);
  tasks.arrived.wait(lock, [] { return !tasks.queue.empty(); });
  *message = tasks.queue.front();
  tasks.queue.pop_front();
  return 1;
}
int destroy_task(int) {
  const Message end{};
  send_message(0, &end);
  tasks.thread.join();
  ++tasks.destroyed;
  return 1;
}
void sleep_shortly(int) {
  std::this_thread::sleep_for(std::chrono::milliseconds(1));
}

// Holds a decode at its first progress report until it is opened.
std::atomic<bool> gateOpen, decoding;
void wait_at_gate(intptr_t, int) {
  decoding = true;
  while (!gateOpen) std::this_thread::yield();
}

class Tasks : public testing::Test {
 protected:
  Tasks() {
    gateOpen = decoding = false;
    tasks.created = tasks.destroyed = 0;
    pelo::zoom::taskLayer = {create_task,     start_task,   send_message,
                             receive_message, destroy_task, sleep_shortly};
  }
  ~Tasks() override {
    EXPECT_EQ(tasks.created, tasks.destroyed);
    EXPECT_TRUE(tasks.queue.empty());
    pelo::zoom::taskLayer = before_;
  }
  int start(int priority) {
    return TAVIRPELO_StartZoom(info_.get(), preview_.data(), 20, 20, display_.data(), 50, 50, 0, 8 << 20,
                               1, priority);
  }
  int refresh() { return TAVIRPELO_RefreshZoom(info_.get(), display_.data(), 50, 50); }

  pelo::zoom::TaskLayer before_ = pelo::zoom::taskLayer;
  Bytes jpeg_ = sample_jpeg(200, 150), preview_ = Bytes(20 * 20 * 3, 77);
  DecInfo info_ = open_memory(jpeg_, TAVIRPELO_RGB888);
  GuardedPixels display_{50, 50, TAVIRPELO_RGB888};
};

TEST_F(Tasks, RefreshesUntilThePictureIsThere) {
  ASSERT_EQ(1, start(-1));
  const Bytes sharp = display_.content();
  EXPECT_EQ(1, TAVIRPELO_StopZoom(info_.get()));
  EXPECT_EQ(0, tasks.created);

  ASSERT_EQ(1, PELOJ_SetCallback(info_.get(), wait_at_gate, 1));
  ASSERT_EQ(1, start(5));
  EXPECT_EQ(5, tasks.priority);
  while (!decoding) std::this_thread::yield();
  EXPECT_EQ(1, refresh());  // notices that the decode runs
  EXPECT_EQ(1, refresh());  // draws, still decoding
  EXPECT_NE(sharp, display_.content());
  gateOpen = true;
  int calls = 0;
  while (refresh() != 0) ASSERT_LT(++calls, 100000);
  EXPECT_EQ(sharp, display_.content());
  EXPECT_EQ(1, refresh());  // the protocol starts again
  EXPECT_EQ(1, refresh());
  EXPECT_EQ(0, refresh());
  EXPECT_EQ(1, TAVIRPELO_StopZoom(info_.get()));
}

TEST_F(Tasks, EndsWaitForTheDecode) {
  ASSERT_EQ(1, PELOJ_SetCallback(info_.get(), wait_at_gate, 1));
  ASSERT_EQ(1, start(0));
  while (!decoding) std::this_thread::yield();
  std::thread opener([] {
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    gateOpen = true;
  });
  EXPECT_EQ(1, TAVIRPELO_StopZoom(info_.get()));
  EXPECT_TRUE(gateOpen);
  opener.join();
  // An object that is destroyed while its zoom decodes; and starts that are stopped at any moment.
  for (int n = 0; n < 30; ++n) {
    ASSERT_EQ(1, start(0));
    std::this_thread::sleep_for(std::chrono::microseconds(100 * n));
    if (n % 2) {
      info_ = open_memory(jpeg_, TAVIRPELO_RGB888);
    } else {
      EXPECT_EQ(1, TAVIRPELO_StopZoom(info_.get()));
    }
  }
}

TEST_F(Tasks, TaskThatCannotBeCreatedLeavesThePreview) {
  pelo::zoom::taskLayer.create = [](int, TAVIRPELO_TASKFN) { return -1; };
  ASSERT_EQ(1, start(0));
  EXPECT_EQ(77, display_.data()[3 * (25 * 50 + 25)]);
  EXPECT_EQ(1, TAVIRPELO_StopZoom(info_.get()));
}

}  // namespace
}  // namespace tests
