// The Android log: on Android the system's own, elsewhere a stand-in that writes "E/tag: text" lines to
// stderr or to a test's capture.
#pragma once

#ifdef __ANDROID__
#include <android/log.h>
#else

enum { ANDROID_LOG_INFO = 4, ANDROID_LOG_ERROR = 6 };

extern "C" int __android_log_print(int priority, const char* tag, const char* format, ...)
    __attribute__((format(printf, 3, 4)));

namespace pelo::platform {

// Receives each finished line, without a newline. Null restores stderr.
using LogSink = void (*)(const char* line);
void set_log_sink(LogSink sink);

}  // namespace pelo::platform
#endif

namespace pelo {

// One error line of the codec.
inline void log_error(const char* text) {
  __android_log_print(ANDROID_LOG_ERROR, "TavirPelo", "%s", text);
}

}  // namespace pelo
