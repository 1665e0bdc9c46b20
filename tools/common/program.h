// The frame of a program with subcommands: the command line in, the exit code out.
#pragma once

#include <CLI/CLI.hpp>
#include <string>

#include "tools/common/exit_code.h"

namespace tool {

// Reads the command line, which runs the chosen command; that one stores its outcome in `result`.
// Returns the process's exit code.
int run(CLI::App& app, int argc, char** argv, Exit& result);

// What every program's help ends with.
std::string footer();

}  // namespace tool
