#include "jni/natives.h"

namespace pelo::bridge {
namespace {

// The size that new shows fit their pictures to, pixels.
constexpr int kShowWidth = 480;
constexpr int kShowHeight = 480;

void log_start() {
  log(ANDROID_LOG_INFO,
      "&&&&&&&&&&&&&&&&&&&&&&&&&&&&&&&&&&& NATIVE METHOD : CREATE SHOW Start 0909071301");
}

}  // namespace

jint CreateShow(JNIEnv* env, jclass, jstring path) {
  log_start();
  const JavaString pathText(env, path);
  if (pathText.failed() || !provide_table()) return SlideShow::kGeneralFailure;
  const int slot = first_free_slot();
  if (slot == kSlots) return SlideShow::kGeneralFailure;
  return admit(slot, gShowTable[slot].CreateShow(pathText.get(), kShowWidth, kShowHeight));
}

jint OpenShow(JNIEnv* env, jclass, jstring path) {
  log_start();
  const JavaString pathText(env, path);
  if (pathText.get() == nullptr || !provide_table()) return SlideShow::kGeneralFailure;
  const int slot = slot_for_path(pathText.get());
  if (slot == kSlots) return SlideShow::kGeneralFailure;
  SlideShow& show = gShowTable[slot];
  if (show.mode != SlideShow::kFree) return slot;
  return admit(slot, show.OpenShow(pathText.get(), kShowWidth, kShowHeight));
}

jint DeleteShow(JNIEnv*, jclass, jint handle) {
  return delete_show(handle);
}

void DestroyShowHandler(JNIEnv*, jclass) {
  destroy_table();
}

jint GetThumbnail(JNIEnv* env, jclass, jint handle, jint index, jint width, jint height,
                  jintArray pixels) {
  SlideShow* show = slot_of(handle);
  if (show == nullptr) return 0;
  const PinnedArray canvas(env, pixels);
  return canvas.get() == nullptr ? 0 : show->GetDrawble(index, canvas.get(), width, height);
}

jint GetBitmap(JNIEnv* env, jclass owner, jint handle, jint index, jintArray pixels) {
  const SlideShow* show = slot_of(handle);
  if (show == nullptr) return 0;
  return GetThumbnail(env, owner, handle, index, show->GetSubWidth(index), show->GetSubHeight(index),
                      pixels);
}

jint GetBitmapToBuffer(JNIEnv* env, jclass, jint handle, jint index, jbyteArray bytes, jint length,
                       jintArray pixels) {
  SlideShow* show = slot_of(handle);
  if (show == nullptr || bytes == nullptr || pixels == nullptr) return 0;
  PinnedArray canvas(env, pixels);
  if (canvas.get() == nullptr) return 0;
  PinnedArray data(env, bytes);
  if (data.get() == nullptr) return 0;
  const jint drawn = show->GetDrawbleToBuffer(data.get(), length, canvas.get(), show->GetSubWidth(index),
                                              show->GetSubHeight(index));
  canvas.release();
  data.release();
  return drawn;
}

}  // namespace pelo::bridge
