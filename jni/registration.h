// Entries of the registration table. A signature is written out for the reader and compared with the
// function's type by the compiler.
#pragma once

#include <jni.h>

#include <string_view>

namespace pelo::bridge {

// The letters by which the VM's signatures name a type.
template <class T>
struct TypeCode;
template <>
struct TypeCode<void> {
  static constexpr std::string_view kText = "V";
};
template <>
struct TypeCode<jint> {
  static constexpr std::string_view kText = "I";
};
template <>
struct TypeCode<jboolean> {
  static constexpr std::string_view kText = "Z";
};
template <>
struct TypeCode<jstring> {
  static constexpr std::string_view kText = "Ljava/lang/String;";
};
template <>
struct TypeCode<jbyteArray> {
  static constexpr std::string_view kText = "[B";
};
template <>
struct TypeCode<jintArray> {
  static constexpr std::string_view kText = "[I";
};

// Whether the signature is that of a static native method with this function.
template <class Result, class... Arguments>
constexpr bool describes(std::string_view signature, Result (*)(JNIEnv*, jclass, Arguments...)) {
  const auto take = [&signature](std::string_view part) {
    if (!signature.starts_with(part)) return false;
    signature.remove_prefix(part.size());
    return true;
  };
  return take("(") && (take(TypeCode<Arguments>::kText) && ...) && take(")") &&
         take(TypeCode<Result>::kText) && signature.empty();
}

void signature_does_not_fit_the_function();

template <auto Function>
struct Signature {
  const char* text;

  // Does not compile for a signature that does not fit.
  consteval Signature(const char* signature) : text(signature) {
    if (!describes(signature, Function)) signature_does_not_fit_the_function();
  }
};

// Some headers of the VM have the texts as plain pointers; it does not write to them.
template <auto Function>
JNINativeMethod native(const char* name, Signature<Function> signature) {
  return {const_cast<char*>(name), const_cast<char*>(signature.text), reinterpret_cast<void*>(Function)};
}

}  // namespace pelo::bridge
