// What a command can end with, and the one way to complain.
#pragma once

#include <fmt/format.h>

#include <cstdio>
#include <utility>

namespace tool {

// How the program calls itself; each one defines its own.
extern const char kProgram[];

// The process's exit code.
enum class Exit {
  kDone = 0,
  kUsage = 2,         // the command line makes no sense
  kCannotOpen = 3,    // a show or picture cannot be opened or read
  kRefused = 4,       // the request was understood and turned down
  kWriteFailure = 5,  // the result could not be written
};

// Writes "PROGRAM: message" to stderr and hands the code back.
template <typename... Args>
Exit fail(Exit code, fmt::format_string<Args...> format, Args&&... args) {
  fmt::print(stderr, "{}: {}\n", kProgram, fmt::format(format, std::forward<Args>(args)...));
  return code;
}

}  // namespace tool
