#include "platform/android_log.h"

#ifndef __ANDROID__
#include <cstdarg>
#include <cstdio>

namespace {

pelo::platform::LogSink logSink = nullptr;

char priority_letter(int priority) {
  constexpr char kLetters[] = "??VDIWEF";
  return priority >= 0 && priority < 8 ? kLetters[priority] : '?';
}

}  // namespace

void pelo::platform::set_log_sink(LogSink sink) { logSink = sink; }

extern "C" int __android_log_print(int priority, const char* tag, const char* format, ...) {
  char text[1024];
  va_list arguments;
  va_start(arguments, format);
  std::vsnprintf(text, sizeof text, format, arguments);
  va_end(arguments);

  char line[1200];
  const int length =
      std::snprintf(line, sizeof line, "%c/%s: %s", priority_letter(priority), tag, text);
  if (logSink != nullptr) {
    logSink(line);
  } else {
    std::fprintf(stderr, "%s\n", line);
  }
  return length;
}
#endif
