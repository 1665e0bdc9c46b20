// The entry of the library for a Java VM: registers the native methods of
// com.tavir.slideshow.SlideShowJNI.
#include <jni.h>

#include <iterator>

#include "jni/natives.h"
#include "jni/registration.h"

namespace pelo::bridge {
namespace {

constexpr char kClassPath[] = "com/tavir/slideshow/SlideShowJNI";

using Show = SlideShow;

// The table is made when it is needed: an array at file scope would be filled by an initialiser that
// runs when the library is loaded.
bool register_natives(JNIEnv* env) {
  const JNINativeMethod natives[] = {
      native<CreateShow>("CreateShow", "(Ljava/lang/String;)I"),
      native<OpenShow>("OpenShow", "(Ljava/lang/String;)I"),
      native<DeleteShow>("DeleteShow", "(I)I"),
      native<DestroyShowHandler>("DestroyShowHandler", "()V"),
      native<from_file<&Show::AddImageToFile>>("AddImageToFile",
                                               "(ILjava/lang/String;Ljava/lang/String;)I"),
      native<from_bytes<&Show::AddImageToBuffer>>("AddImageToBuffer", "(I[BILjava/lang/String;)I"),
      native<from_file<&Show::InsertImageToFile, jint>>("InsertImageToFile",
                                                        "(ILjava/lang/String;Ljava/lang/String;I)I"),
      native<from_bytes<&Show::InsertImageToBuffer, jint>>("InsertImageToBuffer",
                                                           "(I[BILjava/lang/String;I)I"),
      native<with_path<&Show::AddMusic>>("AddMusic", "(ILjava/lang/String;)I"),
      native<call<&Show::RemoveMusic>>("RemoveMusic", "(I)I"),
      native<call<&Show::RemoveImage, jint>>("RemoveImage", "(II)I"),
      native<call<&Show::RemoveSubfile>>("RemoveCache", "(I)I"),
      native<call<&Show::GetImageState, jint>>("GetImageState", "(II)I"),
      native<GetBitmap>("GetBitmap", "(II[I)I"),
      native<GetBitmapToBuffer>("GetBitmapToBuffer", "(II[BI[I)I"),
      native<GetThumbnail>("GetThumbnail", "(IIII[I)I"),
      native<call<&Show::GetSubWidth, jint>>("GetBitmapWidth", "(II)I"),
      native<call<&Show::GetSubHeight, jint>>("GetBitmapHeight", "(II)I"),
      native<get_number<&Show::subfileCount>>("GetNumFrames", "(I)I"),
      native<get_flag<&Show::shuffle>>("GetShuffleMode", "(I)Z"),
      native<get_number<&Show::effectType>>("GetEffectType", "(I)I"),
      native<get_number<&Show::interval>>("GetInterval", "(I)I"),
      native<get_flag<&Show::screenDirection>>("GetScreenDirection", "(I)Z"),
      native<get_flag<&Show::loop>>("GetLoopMode", "(I)Z"),
      native<text<&Show::GetMusic>>("GetMusicFilename", "(I[B)I"),
      native<call<&Show::GetMusicSize>>("GetMusicSize", "(I)I"),
      native<set_number<&Show::interval>>("SetInterval", "(II)V"),
      native<set_number<&Show::effectType>>("SetEffectType", "(II)V"),
      native<set_flag<&Show::shuffle>>("SetShuffleMode", "(IZ)V"),
      native<set_flag<&Show::loop>>("SetLoopMode", "(IZ)V"),
      native<set_flag<&Show::screenDirection>>("SetScreenDirection", "(IZ)V"),
      native<with_path<&Show::SetPathName>>("SetPathName", "(ILjava/lang/String;)I"),
      native<text<&Show::GetLastInformation>>("GetLastInformation", "(I[B)I"),
  };
  jclass owner = env->FindClass(kClassPath);
  if (owner == nullptr) {
    log(ANDROID_LOG_ERROR, "Native registration unable to find class '%s'", kClassPath);
    return false;
  }
  if (env->RegisterNatives(owner, natives, static_cast<jint>(std::size(natives))) < 0) {
    log(ANDROID_LOG_ERROR, "RegisterNatives failed for '%s'", kClassPath);
    return false;
  }
  return true;
}

}  // namespace
}  // namespace pelo::bridge

JNIEXPORT jint JNICALL JNI_OnLoad(JavaVM* vm, void*) {
  using pelo::bridge::log;
  void* env = nullptr;
  if (vm->GetEnv(&env, JNI_VERSION_1_4) != JNI_OK) {
    log(ANDROID_LOG_ERROR, "ERROR: GetEnv failed");
    return -1;
  }
  if (!pelo::bridge::register_natives(static_cast<JNIEnv*>(env))) {
    log(ANDROID_LOG_ERROR, "ERROR: registerNatives failed");
    return -1;
  }
  return JNI_VERSION_1_4;
}
