// Opening the show that the user named.
#pragma once

#include <string>

#include "slideshow/SlideShow.h"
#include "tools/vss/exit_code.h"

namespace vss {

enum class Access { kRead, kEdit };

// Opens the show at `path` and makes it the file that `show` works on.
//
// A container records its own path, and an opened show follows the recorded one. When the file was moved
// or copied since, an edit first records the new path in it; reading only redirects the object and
// writes nothing.
Exit open_show(SlideShow& show, const std::string& path, Access access);

// Complains unless the show has a picture of that index.
Exit check_index(const SlideShow& show, int index);

}  // namespace vss
