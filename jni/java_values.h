// Java strings and arrays on loan: taken when made, given back when they end.
#pragma once

#include <jni.h>

#include <utility>

namespace pelo::bridge {

// The modified UTF-8 of a string: U+0000 is C0 80, characters beyond U+FFFF are six bytes. A null string
// is a null pointer and takes nothing.
class JavaString {
 public:
  JavaString(JNIEnv* env, jstring string)
      : env_(env),
        string_(string),
        text_(string == nullptr ? nullptr : env->GetStringUTFChars(string, nullptr)) {}
  ~JavaString() {
    if (text_ != nullptr) env_->ReleaseStringUTFChars(string_, text_);
  }
  JavaString(const JavaString&) = delete;
  JavaString& operator=(const JavaString&) = delete;

  const char* get() const { return text_; }
  // There is a string, but the VM had no memory for its characters.
  bool failed() const { return string_ != nullptr && text_ == nullptr; }

 private:
  JNIEnv* env_;
  jstring string_;
  const char* text_;
};

// The elements of a primitive array. While one is pinned nothing may be asked of the VM but to pin and
// release further arrays, so strings are taken before and released after. Null for a null array, which
// is not pinned, and when the VM has no memory.
class PinnedArray {
 public:
  PinnedArray(JNIEnv* env, jarray array)
      : env_(env),
        array_(array),
        elements_(array == nullptr ? nullptr : env->GetPrimitiveArrayCritical(array, nullptr)) {}
  ~PinnedArray() { release(); }
  PinnedArray(const PinnedArray&) = delete;
  PinnedArray& operator=(const PinnedArray&) = delete;

  void* get() const { return elements_; }

  // Copies back what the VM may have copied out, and unpins.
  void release() {
    void* elements = std::exchange(elements_, nullptr);
    if (elements != nullptr) env_->ReleasePrimitiveArrayCritical(array_, elements, 0);
  }

 private:
  JNIEnv* env_;
  jarray array_;
  void* elements_;
};

}  // namespace pelo::bridge
