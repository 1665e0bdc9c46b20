// Arguments that commands of several programs take.
#pragma once

#include <CLI/CLI.hpp>
#include <string>

namespace tool {

struct Size {
  int width = 0;  // pixels
  int height = 0;
};

// Longest side of a picture that the encoder takes, pixels.
inline constexpr int kMaxSide = 4999;

// A size given as WIDTHxHEIGHT, each side 1 to `maxSide`.
CLI::Option* add_size_argument(CLI::App& command, const std::string& name, Size& size, int maxSide,
                               const std::string& description);

// --quality, 1 to 100.
CLI::Option* add_quality_option(CLI::App& command, int& quality);

}  // namespace tool
