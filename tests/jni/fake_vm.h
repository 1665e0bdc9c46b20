// A Java VM that has only the functions that the bridge may call, and keeps account of them.
#pragma once

#include <jni.h>

#include <cstdint>
#include <map>
#include <string>
#include <vector>

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
  // Loads the library into it and keeps what it registers. The result of JNI_OnLoad.
  FakeVm();
  ~FakeVm();
  FakeVm(const FakeVm&) = delete;
  FakeVm& operator=(const FakeVm&) = delete;
  jint load();

  // Calls a registered method; its arguments behind env and class must be of the C types.
  template <class Result = jint, class... Arguments>
  Result call(const std::string& name, Arguments... arguments) {
    auto* function = reinterpret_cast<Result (*)(JNIEnv*, jclass, Arguments...)>(functionOf.at(name));
    return function(&env_, nullptr, arguments...);
  }

  // What goes wrong.
  bool failGetEnv = false, failFindClass = false, failRegister = false;
  int failStringAt = 0;  // the n-th taken from now on; 0 none
  int failPinAt = 0;

  // What happened.
  std::vector<std::string> order;  // names of the registered methods
  std::map<std::string, std::string> signatureOf;
  std::map<std::string, void*> functionOf;
  std::vector<std::string> log;           // of the library
  std::vector<const void*> pins, unpins;  // arrays in the order of the calls
  int stringsTaken = 0, stringsReleased = 0;
  int callsWhilePinned = 0;

  bool balanced() const;

 private:
  static FakeVm* current;
  static jint get_env(JavaVM*, void** env, jint version);
  static jclass find_class(JNIEnv*, const char* name);
  static jint register_natives(JNIEnv*, jclass, const JNINativeMethod* methods, jint count);
  static const char* take(JNIEnv*, jstring string, jboolean* isCopy);
  static void release(JNIEnv*, jstring string, const char* text);
  static void* pin(JNIEnv*, jarray array, jboolean* isCopy);
  static void unpin(JNIEnv*, jarray array, void* elements, jint mode);
  void note_call();

  JNINativeInterface_ functions_ = {};
  JNIInvokeInterface_ invoke_ = {};
  JNIEnv env_;
  JavaVM vm_;
};

}  // namespace tests
