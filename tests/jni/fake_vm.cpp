#include "tests/jni/fake_vm.h"

#include <gtest/gtest.h>

#include <cstring>

#include "platform/android_log.h"

namespace tests {

FakeVm* FakeVm::current = nullptr;

FakeVm::FakeVm() {
  current = this;
  functions_.FindClass = find_class;
  functions_.RegisterNatives = register_natives;
  functions_.GetStringUTFChars = take;
  functions_.ReleaseStringUTFChars = release;
  functions_.GetPrimitiveArrayCritical = pin;
  functions_.ReleasePrimitiveArrayCritical = unpin;
  invoke_.GetEnv = get_env;
  env_.functions = &functions_;
  vm_.functions = &invoke_;
  pelo::platform::set_log_sink([](const char* line) { current->log.emplace_back(line); });
}

FakeVm::~FakeVm() {
  pelo::platform::set_log_sink(nullptr);
  current = nullptr;
}

jint FakeVm::load() {
  return JNI_OnLoad(&vm_, nullptr);
}

bool FakeVm::balanced() const {
  return stringsTaken == stringsReleased && pins.size() == unpins.size() && callsWhilePinned == 0;
}

void FakeVm::note_call() {
  if (pins.size() != unpins.size()) ++callsWhilePinned;
}

jint FakeVm::get_env(JavaVM*, void** env, jint version) {
  EXPECT_EQ(0x10004, version);
  if (current->failGetEnv) return JNI_EVERSION;
  *env = &current->env_;
  return JNI_OK;
}

jclass FakeVm::find_class(JNIEnv*, const char* name) {
  EXPECT_STREQ("com/tavir/slideshow/SlideShowJNI", name);
  return current->failFindClass ? nullptr : reinterpret_cast<jclass>(current);
}

jint FakeVm::register_natives(JNIEnv*, jclass, const JNINativeMethod* methods, jint count) {
  if (current->failRegister) return JNI_ERR;
  for (jint i = 0; i < count; ++i) {
    current->order.emplace_back(methods[i].name);
    current->signatureOf[methods[i].name] = methods[i].signature;
    current->functionOf[methods[i].name] = methods[i].fnPtr;
  }
  return 0;
}

// A copy of its own, so that what is used after its release shows under the sanitizers.
const char* FakeVm::take(JNIEnv*, jstring string, jboolean* isCopy) {
  current->note_call();
  EXPECT_EQ(nullptr, isCopy);
  if (current->failStringAt > 0 && --current->failStringAt == 0) return nullptr;
  ++current->stringsTaken;
  return strdup(reinterpret_cast<FakeString*>(string)->text.c_str());
}

void FakeVm::release(JNIEnv*, jstring string, const char* text) {
  current->note_call();
  EXPECT_EQ(reinterpret_cast<FakeString*>(string)->text, text);
  ++current->stringsReleased;
  free(const_cast<char*>(text));
}

void* FakeVm::pin(JNIEnv*, jarray array, jboolean* isCopy) {
  EXPECT_NE(nullptr, array);
  EXPECT_EQ(nullptr, isCopy);
  if (current->failPinAt > 0 && --current->failPinAt == 0) return nullptr;
  current->pins.push_back(array);
  return array;
}

void FakeVm::unpin(JNIEnv*, jarray array, void* elements, jint mode) {
  EXPECT_EQ(static_cast<void*>(array), elements);
  EXPECT_EQ(0, mode);
  current->unpins.push_back(array);
}

}  // namespace tests
