// The frame of a program with subcommands: the command line in, the exit code out.
#pragma once

#include <CLI/CLI.hpp>
#include <span>
#include <string>

#include "tools/common/exit_code.h"

namespace tool {

// Adds one subcommand; its outcome is stored in `result` when the command line has been read.
using Register = void (*)(CLI::App& app, Exit& result);

// Adds the commands and reads the command line, which runs the chosen one. Returns the process's exit
// code.
int run(CLI::App& app, std::span<const Register> commands, int argc, char** argv);

// What every program's help ends with.
std::string footer();

}  // namespace tool
