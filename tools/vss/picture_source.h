// Pictures on their way into a show: what the file holds, and the line that reports an addition.
#pragma once

#include <functional>
#include <string>

#include "slideshow/SlideShow.h"
#include "tools/vss/exit_code.h"

namespace vss {

// The name a picture gets when the user gives none: its file name without folder and extension.
std::string default_name(const std::string& path);

// Prints the heading of the lines that add_picture prints.
void print_added_heading();

// Runs `add`, an operation of the show that puts the picture at `path` in at `index`, and prints a line
// about it. When the show answers no, tells whether the picture or the writing is to blame.
Exit add_picture(SlideShow& show, const std::string& path, int index, const std::function<int()>& add);

}  // namespace vss
