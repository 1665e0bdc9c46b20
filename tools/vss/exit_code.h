// What a command of vss can end with, and the one way to complain.
#pragma once

#include <fmt/format.h>

#include <cstdio>
#include <utility>

namespace vss {

// The process's exit code.
enum class Exit {
  kDone = 0,
  kUsage = 2,         // the command line makes no sense
  kCannotOpen = 3,    // a show or picture cannot be opened or read
  kRefused = 4,       // the request was understood and turned down
  kWriteFailure = 5,  // the result could not be written
};

// Writes "vss: message" to stderr and hands the code back.
template <typename... Args>
Exit fail(Exit code, fmt::format_string<Args...> format, Args&&... args) {
  fmt::print(stderr, "vss: {}\n", fmt::format(format, std::forward<Args>(args)...));
  return code;
}

}  // namespace vss
