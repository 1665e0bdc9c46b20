// Arguments that several subcommands take.
#pragma once

#include <string>

#include "tools/common/arguments.h"

namespace vss {

using tool::add_quality_option;
using tool::add_size_argument;
using tool::kMaxSide;
using tool::Size;

// The show's file, first positional argument of every command.
CLI::Option* add_show_argument(CLI::App& command, std::string& path);

}  // namespace vss
