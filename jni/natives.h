// What the Java class's native methods do. Methods alike are one template.
//
// How to read this room: the table in TavirSlideShowNative.cpp lists every native method with the
// function behind it, and registration.h makes the compiler compare the two. A function finds its show
// by handle in show_table and takes strings and arrays on loan from java_values.h; what it then does is
// a method of SlideShow. Nothing is decided here but how handles count and what Java is told.
//
// Every method but the first four answers 0, or does nothing, for a handle outside the open shows. A
// free slot among them makes the getters answer -2 or 254 and the methods of SlideShow refuse.
#pragma once

#include <jni.h>

#include "jni/java_values.h"
#include "jni/show_table.h"
#include "platform/android_log.h"

namespace pelo::bridge {

// ---- the bridge's lines in the Android log ----

// `format` and its one argument as in printf.
inline void log(int priority, const char* format, const char* argument) {
  __android_log_print(priority, "TavirSlideShowNative", format, argument);
}

inline void log(int priority, const char* text) {
  log(priority, "%s", text);
}

// ---- shows ----

jint CreateShow(JNIEnv* env, jclass, jstring path);
jint OpenShow(JNIEnv* env, jclass, jstring path);
jint DeleteShow(JNIEnv*, jclass, jint handle);
void DestroyShowHandler(JNIEnv*, jclass);

// ---- drawing ----

jint GetBitmap(JNIEnv* env, jclass, jint handle, jint index, jintArray pixels);
jint GetBitmapToBuffer(JNIEnv* env, jclass, jint handle, jint index, jbyteArray bytes, jint length,
                       jintArray pixels);
jint GetThumbnail(JNIEnv* env, jclass, jint handle, jint index, jint width, jint height,
                  jintArray pixels);

// ---- methods of SlideShow that take and give numbers ----

template <auto Method, class... Numbers>
jint call(JNIEnv*, jclass, jint handle, Numbers... numbers) {
  SlideShow* show = slot_of(handle);
  return show == nullptr ? 0 : (show->*Method)(numbers...);
}

// ---- methods of SlideShow that take a path ----

template <auto Method>
jint with_path(JNIEnv* env, jclass, jint handle, jstring path) {
  SlideShow* show = slot_of(handle);
  if (show == nullptr) return 0;
  const JavaString pathText(env, path);
  return pathText.get() == nullptr ? 0 : (show->*Method)(pathText.get());
}

// ---- adding pictures; the name may be null ----

template <auto Method, class... Position>
jint from_file(JNIEnv* env, jclass, jint handle, jstring path, jstring name, Position... position) {
  SlideShow* show = slot_of(handle);
  if (show == nullptr) return 0;
  const JavaString pathText(env, path);
  if (pathText.get() == nullptr) return 0;
  const JavaString nameText(env, name);
  return nameText.failed() ? 0 : (show->*Method)(pathText.get(), nameText.get(), position...);
}

template <auto Method, class... Position>
jint from_bytes(JNIEnv* env, jclass, jint handle, jbyteArray bytes, jint length, jstring name,
                Position... position) {
  SlideShow* show = slot_of(handle);
  if (show == nullptr || bytes == nullptr) return 0;
  const JavaString nameText(env, name);
  if (nameText.failed()) return 0;
  const PinnedArray data(env, bytes);
  return data.get() == nullptr ? 0 : (show->*Method)(data.get(), length, nameText.get(), position...);
}

// ---- methods of SlideShow that give a text, at most 255 bytes and a terminator ----

template <auto Method>
jint text(JNIEnv* env, jclass, jint handle, jbyteArray bytes) {
  SlideShow* show = slot_of(handle);
  if (show == nullptr) return 0;
  const PinnedArray buffer(env, bytes);
  return buffer.get() == nullptr ? 0 : (show->*Method)(static_cast<char*>(buffer.get()));
}

// ---- settings: fields of the show ----

using Field = int SlideShowFields::*;

template <Field field>
jint get_number(JNIEnv*, jclass, jint handle) {
  const SlideShow* show = slot_of(handle);
  if (show == nullptr) return 0;
  return show->mode == SlideShow::kFree ? -2 : show->*field;
}

// A file may hold any number: its low byte goes out as it is.
template <Field field>
jboolean get_flag(JNIEnv*, jclass, jint handle) {
  const SlideShow* show = slot_of(handle);
  if (show == nullptr) return 0;
  return show->mode == SlideShow::kFree ? 254 : static_cast<jboolean>(show->*field);
}

template <Field field>
void set_number(JNIEnv*, jclass, jint handle, jint value) {
  SlideShow* show = slot_of(handle);
  if (show == nullptr || show->mode == SlideShow::kFree) return;
  show->*field = value;
  (void)show->writeVssHeader("r+b");
}

template <Field field>
void set_flag(JNIEnv* env, jclass owner, jint handle, jboolean value) {
  set_number<field>(env, owner, handle, value != 0 ? 1 : 0);
}

}  // namespace pelo::bridge
