// A Java VM that has only the functions that the bridge may call, and keeps account of them.
#pragma once

#include <gtest/gtest.h>
#include <jni.h>

#include <cstdint>
#include <cstring>
#include <map>
#include <string>
#include <vector>

#include "platform/android_log.h"

namespace tests {

// A string or an array as the bridge sees it: an address that only the VM can read.
struct FakeString {
  std::string text;
  jstring ref() { return reinterpret_cast<jstring>(this); }
};
template <class Element, class Ref>
struct FakeArray {
  std::vector<Element> elements;
  Ref ref() { return reinterpret_cast<Ref>(&elements[0]); }
};
using FakeBytes = FakeArray<uint8_t, jbyteArray>;
using FakePixels = FakeArray<uint32_t, jintArray>;

class FakeVm {
 public:
  FakeVm() {
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
  ~FakeVm() { pelo::platform::set_log_sink(nullptr); }
  FakeVm(const FakeVm&) = delete;
  FakeVm& operator=(const FakeVm&) = delete;

  // Loads the library, which registers its methods.
  jint load() { return JNI_OnLoad(&vm_, nullptr); }

  // Calls a registered method; its arguments behind env and class must be of the C types.
  template <class Result = jint, class... Arguments>
  Result call(const std::string& name, Arguments... arguments) {
    auto* function = reinterpret_cast<Result (*)(JNIEnv*, jclass, Arguments...)>(methods.at(name).fnPtr);
    return function(&env_, nullptr, arguments...);
  }

  bool balanced() const {
    return stringsTaken == stringsReleased && pins.size() == unpins.size() && callsWhilePinned == 0;
  }

  // What goes wrong.
  bool failGetEnv = false, failFindClass = false, failRegister = false;
  int failStringAt = 0, failPinAt = 0;  // the n-th taken from now on; 0 none

  // What happened.
  std::vector<std::string> order;  // names of the registered methods
  std::map<std::string, JNINativeMethod> methods;
  std::vector<std::string> log;           // of the library
  std::vector<const void*> pins, unpins;  // arrays in the order of the calls
  int stringsTaken = 0, stringsReleased = 0, callsWhilePinned = 0;

 private:
  static jint get_env(JavaVM*, void** env, jint version) {
    EXPECT_EQ(0x10004, version);
    if (current->failGetEnv) return JNI_EVERSION;
    *env = &current->env_;
    return JNI_OK;
  }
  static jclass find_class(JNIEnv*, const char* name) {
    EXPECT_STREQ("com/tavir/slideshow/SlideShowJNI", name);
    return current->failFindClass ? nullptr : reinterpret_cast<jclass>(current);
  }
  static jint register_natives(JNIEnv*, jclass, const JNINativeMethod* methods, jint count) {
    if (current->failRegister) return JNI_ERR;
    for (jint i = 0; i < count; ++i) {
      current->order.emplace_back(methods[i].name);
      current->methods[methods[i].name] = methods[i];
    }
    return 0;
  }
  // A copy of its own, so that what is used after its release shows under the sanitizers.
  static const char* take(JNIEnv*, jstring string, jboolean* isCopy) {
    current->callsWhilePinned += current->pins.size() != current->unpins.size();
    EXPECT_EQ(nullptr, isCopy);
    if (current->failStringAt > 0 && --current->failStringAt == 0) return nullptr;
    ++current->stringsTaken;
    return strdup(reinterpret_cast<FakeString*>(string)->text.c_str());
  }
  static void release(JNIEnv*, jstring string, const char* text) {
    current->callsWhilePinned += current->pins.size() != current->unpins.size();
    EXPECT_EQ(reinterpret_cast<FakeString*>(string)->text, text);
    ++current->stringsReleased;
    free(const_cast<char*>(text));
  }
  static void* pin(JNIEnv*, jarray array, jboolean* isCopy) {
    EXPECT_NE(nullptr, array);
    EXPECT_EQ(nullptr, isCopy);
    if (current->failPinAt > 0 && --current->failPinAt == 0) return nullptr;
    current->pins.push_back(array);
    return array;
  }
  static void unpin(JNIEnv*, jarray array, void* elements, jint mode) {
    EXPECT_EQ(static_cast<void*>(array), elements);
    EXPECT_EQ(0, mode);
    current->unpins.push_back(array);
  }

  static inline FakeVm* current = nullptr;
  JNINativeInterface_ functions_ = {};
  JNIInvokeInterface_ invoke_ = {};
  JNIEnv env_;
  JavaVM vm_;
};

}  // namespace tests
