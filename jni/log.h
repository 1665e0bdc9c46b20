// The bridge's lines in the Android log.
#pragma once

#include "platform/android_log.h"

namespace pelo::bridge {

// `format` and its one argument as in printf.
inline void log(int priority, const char* format, const char* argument) {
  __android_log_print(priority, "TavirSlideShowNative", format, argument);
}

inline void log(int priority, const char* text) {
  log(priority, "%s", text);
}

}  // namespace pelo::bridge
