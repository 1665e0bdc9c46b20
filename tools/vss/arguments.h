// Arguments that several subcommands take.
#pragma once

#include <CLI/CLI.hpp>
#include <string>

namespace vss {

struct Size {
  int width = 0;  // pixels
  int height = 0;
};

// Longest side of a picture that the encoder takes, pixels.
inline constexpr int kMaxSide = 4999;

// The show's file, first positional argument of every command.
CLI::Option* add_show_argument(CLI::App& command, std::string& path);

// A size given as WIDTHxHEIGHT, each side 1 to `maxSide`.
CLI::Option* add_size_argument(CLI::App& command, const std::string& name, Size& size, int maxSide,
                               const std::string& description);

// --quality, 1 to 100.
CLI::Option* add_quality_option(CLI::App& command, int& quality);

}  // namespace vss
