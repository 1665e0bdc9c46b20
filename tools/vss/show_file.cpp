// Opening the show that the user named, and telling why it cannot be.
#include "tools/vss/show_file.h"

#include <unistd.h>

#include <cerrno>
#include <cstring>

namespace vss {
namespace {

// Stands in until the header's own size replaces it.
constexpr int kAnySize = 480;

Exit explain(int result, const std::string& path) {
  if (access(path.c_str(), R_OK | W_OK) != 0) {
    return fail(Exit::kCannotOpen, "{}: {}", path, std::strerror(errno));
  }
  const char* reason = result == SlideShow::kNotContainer   ? "not a slide show"
                       : result == SlideShow::kWrongVersion ? "a slide show of another version"
                                                            : "damaged or unreadable";
  return fail(Exit::kCannotOpen, "{}: {}", path, reason);
}

}  // namespace

Exit open_show(SlideShow& show, const std::string& path, Access access) {
  int result = show.OpenShow(path.c_str(), kAnySize, kAnySize);
  if (result != 1) return explain(result, path);
  if (path == show.pathName) return Exit::kDone;
  if (access == Access::kEdit) {
    if (show.SetPathName(path.c_str()) == 1) return Exit::kDone;
    return fail(Exit::kWriteFailure, "{}: cannot record the show's new path", path);
  }
  // OpenShow took the path, so it fits with its terminator.
  std::memset(show.pathName, 0, sizeof show.pathName);
  std::memcpy(show.pathName, path.c_str(), path.size());
  return Exit::kDone;
}

Exit check_index(const SlideShow& show, int index) {
  if (index >= 0 && index < show.subfileCount) return Exit::kDone;
  return fail(Exit::kRefused, "{}: no picture {}, the show has {}", show.pathName, index,
              show.subfileCount);
}

}  // namespace vss
