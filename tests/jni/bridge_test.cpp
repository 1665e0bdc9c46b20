// The bridge against a VM that fails on request and counts: loading, handles, and what is taken and
// given back.
#include <gtest/gtest.h>

#include <climits>
#include <cstdlib>
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
constexpr char kTag[] = "E/TavirSlideShowNative: ";
constexpr char kClass[] = "com/tavir/slideshow/SlideShowJNI";

class Bridge : public testing::Test {
 protected:
  void SetUp() override {
    ASSERT_EQ(0x10004, vm.load());
    path.text = file.path();
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

  TempFile file;
  FakeVm vm;
  FakeString path, name{"name"}, empty;
  FakeBytes jpeg, text{Bytes(256, 7)};
  FakePixels pixels{std::vector<uint32_t>(32 * 16, 7)};
  jint size = 0;
};

TEST(Loading, TellsEachFailure) {
  {
    FakeVm vm;
    vm.failGetEnv = true;
    EXPECT_EQ(-1, vm.load());
    EXPECT_EQ(std::vector<std::string>{kTag + std::string("ERROR: GetEnv failed")}, vm.log);
  }
  const std::string second = kTag + std::string("ERROR: registerNatives failed");
  {
    FakeVm vm;
    vm.failFindClass = true;
    EXPECT_EQ(-1, vm.load());
    const std::string first =
        kTag + std::string("Native registration unable to find class '") + kClass + "'";
    EXPECT_EQ((std::vector<std::string>{first, second}), vm.log);
  }
  FakeVm vm;
  vm.failRegister = true;
  EXPECT_EQ(-1, vm.load());
  const std::string first = kTag + std::string("RegisterNatives failed for '") + kClass + "'";
  EXPECT_EQ((std::vector<std::string>{first, second}), vm.log);
}

TEST_F(Bridge, RegistersTheMethodsInOrder) {
  ASSERT_EQ(33u, vm.order.size());
  EXPECT_EQ(33u, vm.functionOf.size());
  EXPECT_TRUE(vm.log.empty());
  EXPECT_EQ("CreateShow", vm.order.front());
  EXPECT_EQ("RemoveCache", vm.order[11]);
  EXPECT_EQ("SetPathName", vm.order[31]);
  EXPECT_EQ("GetLastInformation", vm.order.back());
  EXPECT_EQ("(II[BI[I)I", vm.signatureOf["GetBitmapToBuffer"]);
}

TEST_F(Bridge, LogsEveryAttemptToCreateOrOpen) {
  create();
  vm.call("OpenShow", jstring{});
  open(empty);
  const std::string line = "I/TavirSlideShowNative: " + std::string(35, '&') +
                           " NATIVE METHOD : CREATE SHOW Start 0909071301";
  EXPECT_EQ(std::vector<std::string>(3, line), vm.log);
}

TEST_F(Bridge, HandlesAreSlotsBelowTheNumberOfShows) {
  EXPECT_EQ(kBadHandle, remove(0));
  EXPECT_EQ(kFailure, vm.call("OpenShow", jstring{}));
  EXPECT_EQ(1, gShowTableMissing);
  for (jint i = 0; i < 3; ++i) EXPECT_EQ(i, create());
  EXPECT_EQ(1, remove(0));
  EXPECT_EQ(2, gShowCount);
  // Slot 2 is in use, but only two shows are open; slot 0 is free.
  EXPECT_EQ(0, add(2));
  EXPECT_EQ(1, add(1));
  EXPECT_EQ(0, add(0));
  for (const char* getter : {"GetNumFrames", "GetEffectType", "GetInterval"}) {
    EXPECT_EQ(-2, vm.call(getter, jint{0}));
    EXPECT_EQ(0, vm.call(getter, jint{2}));
  }
  for (const char* getter : {"GetShuffleMode", "GetLoopMode", "GetScreenDirection"}) {
    EXPECT_EQ(254, vm.call<jboolean>(getter, jint{0}));
    EXPECT_EQ(0, vm.call<jboolean>(getter, jint{2}));
  }
  vm.call<void>("SetInterval", jint{0}, jint{9});
  EXPECT_EQ(1, gShowTable[0].interval);
  for (const jint handle : {INT_MIN, -1, 0, 3, 99, 100, 101, INT_MAX}) {
    EXPECT_EQ(kBadHandle, remove(handle)) << handle;
  }
  EXPECT_EQ(1, remove(2));  // equal to the count
  EXPECT_EQ(1, gShowCount);
  EXPECT_EQ(0, create());
  // A freed slot starts over.
  EXPECT_EQ(1, remove(1));
  EXPECT_EQ(1, create());
  EXPECT_EQ(0, vm.call("GetNumFrames", jint{1}));
}

TEST_F(Bridge, ATableThatIsFull) {
  ASSERT_EQ(0, create(&path));
  ASSERT_EQ(1, add(0));
  for (jint i = 1; i < 100; ++i) ASSERT_EQ(i, create());
  EXPECT_EQ(kFailure, create());
  EXPECT_EQ(0, open(path));  // is open already
  EXPECT_EQ(kFailure, open(name));
  EXPECT_EQ(kFailure, open(empty));
  EXPECT_EQ(100, gShowCount);
  EXPECT_EQ(kBadHandle, remove(100));
  EXPECT_EQ(1, remove(99));
  EXPECT_EQ(99, create());
}

TEST_F(Bridge, OpensAFileOnce) {
  FakeString missing{file.path() + ".none"};
  ASSERT_EQ(0, create());
  EXPECT_EQ(kFailure, open(empty));  // not the show in memory, which has no path either
  ASSERT_EQ(1, create(&path));
  EXPECT_EQ(0, create(&empty));  // refused, the number of a handle all the same
  EXPECT_EQ(kFailure, open(missing));
  EXPECT_EQ(2, gShowCount);
  ASSERT_EQ(1, add(1));
  EXPECT_EQ(1, open(path));
  EXPECT_EQ(2, gShowCount);
  // The search ends at a free slot, and what lies behind it is not seen.
  EXPECT_EQ(1, remove(0));
  EXPECT_EQ(0, open(path));
  EXPECT_EQ(2, gShowCount);
  EXPECT_EQ(0, open(path));
  file.write(Bytes(100, 'x'));
  EXPECT_EQ(1, remove(1));
  EXPECT_EQ(1, remove(0));
  EXPECT_EQ(kNotContainer, open(path));
  EXPECT_EQ(0, gShowCount);
}

TEST_F(Bridge, NoMemoryForTheTable) {
  failArrayNew = true;
  EXPECT_EQ(kFailure, create(&path));
  EXPECT_EQ(kFailure, open(path));
  failArrayNew = false;
  EXPECT_EQ(1, gShowTableMissing);
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
  FakeString source{file.path() + ".jpg"};
  TempFile sourceFile(".jpg");
  sourceFile.write(jpeg.elements);
  const jint first = 0;
  const auto tries = [&](int strings, int arrays, auto method) {
    for (int i = 1; i <= strings + arrays; ++i) {
      vm.failStringAt = i <= strings ? i : 0;
      vm.failPinAt = i <= strings ? 0 : i - strings;
      EXPECT_EQ(0, method()) << i;
      EXPECT_TRUE(vm.balanced()) << i;
      EXPECT_EQ(0, vm.failStringAt + vm.failPinAt) << i;
    }
    EXPECT_NE(0, method());
    EXPECT_TRUE(vm.balanced());
  };
  tries(2, 0, [&] { return vm.call("AddImageToFile", first, source.ref(), name.ref()); });
  tries(2, 0, [&] { return vm.call("InsertImageToFile", first, source.ref(), name.ref(), first); });
  tries(1, 1, [&] { return vm.call("AddImageToBuffer", first, jpeg.ref(), size, name.ref()); });
  tries(1, 1,
        [&] { return vm.call("InsertImageToBuffer", first, jpeg.ref(), size, name.ref(), first); });
  tries(1, 0, [&] { return vm.call("AddMusic", first, source.ref()); });
  tries(1, 0, [&] { return vm.call("SetPathName", first, path.ref()); });
  tries(0, 1, [&] { return vm.call("GetBitmap", first, first, pixels.ref()); });
  tries(0, 1, [&] { return vm.call("GetThumbnail", first, first, jint{4}, jint{4}, pixels.ref()); });
  tries(0, 1, [&] { return vm.call("GetMusicFilename", first, text.ref()); });
  tries(0, 1, [&] { return vm.call("GetLastInformation", first, text.ref()); });
  tries(0, 2,
        [&] { return vm.call("GetBitmapToBuffer", jint{1}, first, jpeg.ref(), size, pixels.ref()); });
  EXPECT_EQ(5, vm.call("GetNumFrames", first));
}

// Nothing is taken for a call that cannot work: a handle out of range, a null array or path.
TEST_F(Bridge, TakesNothingInVain) {
  ASSERT_EQ(0, create());
  ASSERT_EQ(1, add(0));
  vm.pins.clear();
  vm.unpins.clear();
  const int before = vm.stringsTaken;
  const jstring noText{};
  const jbyteArray noBytes{};
  const jintArray noPixels{};
  for (const jint handle : {jint{0}, jint{1}, jint{-1}}) {
    const bool nulls = handle == 0;
    EXPECT_EQ(0, vm.call("AddImageToFile", handle, nulls ? noText : path.ref(), noText));
    EXPECT_EQ(0, vm.call("InsertImageToFile", handle, nulls ? noText : path.ref(), noText, jint{0}));
    EXPECT_EQ(0, vm.call("AddImageToBuffer", handle, nulls ? noBytes : jpeg.ref(), size, name.ref()));
    EXPECT_EQ(0, vm.call("InsertImageToBuffer", handle, nulls ? noBytes : jpeg.ref(), size, name.ref(),
                         jint{0}));
    EXPECT_EQ(0, vm.call("AddMusic", handle, nulls ? noText : path.ref()));
    EXPECT_EQ(0, vm.call("SetPathName", handle, nulls ? noText : path.ref()));
    EXPECT_EQ(0, vm.call("GetBitmap", handle, jint{0}, nulls ? noPixels : pixels.ref()));
    EXPECT_EQ(
        0, vm.call("GetThumbnail", handle, jint{0}, jint{2}, jint{2}, nulls ? noPixels : pixels.ref()));
    EXPECT_EQ(0, vm.call("GetBitmapToBuffer", handle, jint{0}, nulls ? noBytes : jpeg.ref(), size,
                         pixels.ref()));
    EXPECT_EQ(0, vm.call("GetBitmapToBuffer", handle, jint{0}, jpeg.ref(), size,
                         nulls ? noPixels : pixels.ref()) *
                     !nulls);
    EXPECT_EQ(0, vm.call("GetMusicFilename", handle, nulls ? noBytes : text.ref()));
    EXPECT_EQ(0, vm.call("GetLastInformation", handle, nulls ? noBytes : text.ref()));
  }
  EXPECT_EQ(before, vm.stringsTaken);
  EXPECT_TRUE(vm.pins.empty());
}

TEST_F(Bridge, PinsPixelsBeforeBytesAndReleasesThemSo) {
  ASSERT_EQ(0, create());
  ASSERT_EQ(1, add(0));
  vm.pins.clear();
  vm.unpins.clear();
  EXPECT_EQ(1, vm.call("GetBitmapToBuffer", jint{0}, jint{0}, jpeg.ref(), size, pixels.ref()));
  EXPECT_EQ((std::vector<const void*>{pixels.ref(), jpeg.ref()}), vm.pins);
  EXPECT_EQ(vm.pins, vm.unpins);
  EXPECT_EQ(0xFFu, pixels.elements[0] >> 24);
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
