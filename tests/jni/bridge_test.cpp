// The bridge against a VM that fails on request and counts: loading, handles, and what is taken and
// given back.
#include <gtest/gtest.h>

#include <climits>
#include <cstdlib>
#include <functional>
#include <new>

#include "jni/show_table.h"
#include "tests/jni/fake_vm.h"
#include "tests/support/slideshow_files.h"

namespace {
bool failArrayNew = false;
}  // namespace

// The table of shows is the one array that the bridge makes with new.
void* operator new[](size_t size) {
  return std::malloc(size);
}
void* operator new[](size_t size, const std::nothrow_t&) noexcept {
  return failArrayNew ? nullptr : std::malloc(size);
}
void operator delete[](void* pointer) noexcept {
  std::free(pointer);
}
void operator delete[](void* pointer, size_t) noexcept {
  std::free(pointer);
}

namespace tests {
namespace {

using pelo::bridge::gShowCount;
using pelo::bridge::gShowTable;
using pelo::bridge::gShowTableMissing;

constexpr jint kFailure = INT_MIN + 1, kBadHandle = INT_MIN + 2, kNotContainer = INT_MIN + 3;

class Bridge : public testing::Test {
 protected:
  void SetUp() override {
    ASSERT_EQ(0x10004, vm.load());
    jpeg.elements = encode_own(32, 16, 80);
    size = static_cast<jint>(jpeg.elements.size());
  }
  void TearDown() override {
    vm.call<void>("DestroyShowHandler");
    EXPECT_TRUE(vm.balanced());
    EXPECT_EQ(vm.pins, vm.unpins);
    EXPECT_EQ(nullptr, gShowTable);
    EXPECT_EQ(1, gShowTableMissing);
    EXPECT_EQ(0, gShowCount);
  }
  jint create(FakeString* at = nullptr) { return vm.call("CreateShow", at ? at->ref() : jstring{}); }
  jint open(FakeString& at) { return vm.call("OpenShow", at.ref()); }
  jint add(jint handle) { return vm.call("AddImageToBuffer", handle, jpeg.ref(), size, jstring{}); }
  jint remove(jint handle) { return vm.call("DeleteShow", handle); }

  // The methods that take strings or arrays: how many, and of which show they work.
  struct Taker {
    int strings, arrays;
    jint handle;
    std::function<jint(jint handle)> call;
  };
  std::vector<Taker> takers(bool nulls) {
    const jstring from = nulls ? jstring{} : source.ref(), called = name.ref();
    const jbyteArray bytes = nulls ? jbyteArray{} : jpeg.ref(), out = nulls ? jbyteArray{} : text.ref();
    const jintArray drawn = nulls ? jintArray{} : pixels.ref(), always = pixels.ref();
    const jstring stored = nulls ? jstring{} : path.ref();
    const jint first = 0, side = 4;
    return {
        {2, 0, 0, [=, this](jint h) { return vm.call("AddImageToFile", h, from, called); }},
        {2, 0, 0, [=, this](jint h) { return vm.call("InsertImageToFile", h, from, called, first); }},
        {1, 1, 0, [=, this](jint h) { return vm.call("AddImageToBuffer", h, bytes, size, called); }},
        {1, 1, 0,
         [=, this](jint h) { return vm.call("InsertImageToBuffer", h, bytes, size, called, first); }},
        {1, 0, 0, [=, this](jint h) { return vm.call("AddMusic", h, from); }},
        {1, 0, 0, [=, this](jint h) { return vm.call("SetPathName", h, stored); }},
        {0, 1, 0, [=, this](jint h) { return vm.call("GetBitmap", h, first, drawn); }},
        {0, 1, 0, [=, this](jint h) { return vm.call("GetThumbnail", h, first, side, side, drawn); }},
        {0, 1, 0, [=, this](jint h) { return vm.call("GetMusicFilename", h, out); }},
        {0, 1, 0, [=, this](jint h) { return vm.call("GetLastInformation", h, out); }},
        {0, 2, 1,
         [=, this](jint h) { return vm.call("GetBitmapToBuffer", h, first, bytes, size, always); }}};
  }

  TempFile file, sourceFile{".jpg"};
  FakeVm vm;
  FakeString path{file.path()}, source{sourceFile.path()}, name{"name"}, empty;
  FakeBytes jpeg, text{Bytes(256, 7)};
  FakePixels pixels{std::vector<uint32_t>(32 * 16, 7)};
  jint size = 0;
};

TEST(Loading, TellsEachFailure) {
  const std::string tag = "E/TavirSlideShowNative: ", name = "'com/tavir/slideshow/SlideShowJNI'",
                    second = tag + "ERROR: registerNatives failed";
  const struct {
    bool FakeVm::*fails;
    std::vector<std::string> log;
  } cases[] = {
      {&FakeVm::failGetEnv, {tag + "ERROR: GetEnv failed"}},
      {&FakeVm::failFindClass, {tag + "Native registration unable to find class " + name, second}},
      {&FakeVm::failRegister, {tag + "RegisterNatives failed for " + name, second}}};
  for (const auto& c : cases) {
    FakeVm vm;
    vm.*c.fails = true;
    EXPECT_EQ(-1, vm.load());
    EXPECT_EQ(c.log, vm.log);
  }
}

TEST_F(Bridge, RegistersInOrderAndLogsEveryAttemptToCreateOrOpen) {
  ASSERT_EQ(33u, vm.order.size());
  EXPECT_EQ("CreateShow", vm.order.front());
  EXPECT_EQ("RemoveCache", vm.order[11]);
  EXPECT_EQ("GetLastInformation", vm.order.back());
  EXPECT_STREQ("(II[BI[I)I", vm.methods["GetBitmapToBuffer"].signature);
  EXPECT_TRUE(vm.log.empty());
  create();
  vm.call("OpenShow", jstring{});
  open(empty);
  const std::string line = "I/TavirSlideShowNative: " + std::string(35, '&') +
                           " NATIVE METHOD : CREATE SHOW Start 0909071301";
  EXPECT_EQ(std::vector<std::string>(3, line), vm.log);
}

TEST_F(Bridge, HandlesAreSlotsBelowTheNumberOfShows) {
  for (jint i = 0; i < 3; ++i) EXPECT_EQ(i, create());
  EXPECT_EQ(1, remove(0));
  // Slot 2 is in use, but only two shows are open; slot 0 is free.
  EXPECT_EQ(0, add(2));
  EXPECT_EQ(1, add(1));
  EXPECT_EQ(0, add(0));
  EXPECT_EQ(-2, vm.call("GetInterval", jint{0}));
  EXPECT_EQ(254, vm.call<jboolean>("GetLoopMode", jint{0}));
  vm.call<void>("SetInterval", jint{0}, jint{9});
  EXPECT_EQ(1, gShowTable[0].interval);
  for (const jint handle : {INT_MIN, -1, 0, 3, 99, 100, 101, INT_MAX}) {
    EXPECT_EQ(kBadHandle, remove(handle)) << handle;
  }
  EXPECT_EQ(1, remove(2));  // equal to the count
  EXPECT_EQ(0, create());
  // A freed slot starts over.
  EXPECT_EQ(1, remove(1));
  EXPECT_EQ(1, create());
  EXPECT_EQ(0, vm.call("GetNumFrames", jint{1}));
  // A table that is full.
  for (jint i = 2; i < 100; ++i) ASSERT_EQ(i, create());
  EXPECT_EQ(kFailure, create());
  EXPECT_EQ(kFailure, open(name));
  EXPECT_EQ(kBadHandle, remove(100));
  EXPECT_EQ(1, remove(99));
  EXPECT_EQ(99, create());
}

TEST_F(Bridge, OpensAFileOnce) {
  ASSERT_EQ(0, create());
  EXPECT_EQ(kFailure, open(empty));  // not the show in memory, which has no path either
  ASSERT_EQ(1, create(&path));
  EXPECT_EQ(0, create(&empty));  // refused, the number of a handle all the same
  ASSERT_EQ(1, add(1));
  EXPECT_EQ(1, open(path));
  // The search ends at a free slot, and what lies behind it is not seen.
  EXPECT_EQ(1, remove(0));
  EXPECT_EQ(0, open(path));
  EXPECT_EQ(2, gShowCount);
  EXPECT_EQ(1, remove(1));
  EXPECT_EQ(1, remove(0));
  file.write(Bytes(100, 'x'));
  EXPECT_EQ(kNotContainer, open(path));
  EXPECT_EQ(0, gShowCount);
}

TEST_F(Bridge, NoMemoryForTheTable) {
  failArrayNew = true;
  EXPECT_EQ(kFailure, create(&path));
  EXPECT_EQ(kFailure, open(path));
  failArrayNew = false;
  EXPECT_EQ(0, create(&path));
}

// The VM has no memory for a string or an array: whatever was taken before is given back.
TEST_F(Bridge, NoMemoryInTheVm) {
  vm.failStringAt = 1;
  EXPECT_EQ(kFailure, create(&path));
  vm.failStringAt = 1;
  EXPECT_EQ(kFailure, open(path));
  ASSERT_EQ(0, create(&path));
  ASSERT_EQ(1, create());
  ASSERT_EQ(1, add(0));
  ASSERT_EQ(1, add(1));
  sourceFile.write(jpeg.elements);
  for (const Taker& taker : takers(false)) {
    for (int i = 1; i <= taker.strings + taker.arrays; ++i) {
      vm.failStringAt = i <= taker.strings ? i : 0;
      vm.failPinAt = i <= taker.strings ? 0 : i - taker.strings;
      EXPECT_EQ(0, taker.call(taker.handle)) << i;
      EXPECT_TRUE(vm.balanced()) << i;
      EXPECT_EQ(0, vm.failStringAt + vm.failPinAt) << i;
    }
    EXPECT_NE(0, taker.call(taker.handle));
    EXPECT_TRUE(vm.balanced());
  }
  // Pixels are pinned before bytes, and released so.
  EXPECT_EQ((std::vector<const void*>{pixels.ref(), jpeg.ref()}),
            std::vector<const void*>(vm.pins.end() - 2, vm.pins.end()));
  EXPECT_EQ(0xFFu, pixels.elements[0] >> 24);
  EXPECT_EQ(5, vm.call("GetNumFrames", jint{0}));
}

// Nothing is taken for a call that cannot work: a handle out of range, a null array or path.
TEST_F(Bridge, TakesNothingInVain) {
  ASSERT_EQ(0, create());
  ASSERT_EQ(1, create());
  ASSERT_EQ(1, add(0));
  const int strings = vm.stringsTaken;
  const size_t pins = vm.pins.size();
  for (const Taker& taker : takers(true)) EXPECT_EQ(0, taker.call(taker.handle));
  for (const Taker& taker : takers(false)) {
    EXPECT_EQ(0, taker.call(2));
    EXPECT_EQ(0, taker.call(-1));
  }
  EXPECT_EQ(strings, vm.stringsTaken);
  EXPECT_EQ(pins, vm.pins.size());
}

TEST_F(Bridge, FlagsAreOneByteOnTheWayOutAndOneBitOnTheWayIn) {
  ASSERT_EQ(0, create());
  const struct {
    const char *get, *set;
    int SlideShowFields::*field;
  } flags[] = {{"GetShuffleMode", "SetShuffleMode", &SlideShowFields::shuffle},
               {"GetLoopMode", "SetLoopMode", &SlideShowFields::loop},
               {"GetScreenDirection", "SetScreenDirection", &SlideShowFields::screenDirection}};
  for (const auto& flag : flags) {
    int& field = gShowTable[0].*flag.field;
    for (const int stored : {2, 256, -1}) {
      field = stored;
      EXPECT_EQ(static_cast<uint8_t>(stored), vm.call<jboolean>(flag.get, jint{0}));
    }
    vm.call<void>(flag.set, jint{0}, jboolean{255});
    EXPECT_EQ(1, field);
    vm.call<void>(flag.set, jint{0}, jboolean{0});
    EXPECT_EQ(0, field);
  }
}

}  // namespace
}  // namespace tests
