// The picture that a command works on: a file, or standard input.
#pragma once

#include <CLI/CLI.hpp>
#include <cstdint>
#include <string>
#include <vector>

#include "tools/common/codec_objects.h"
#include "tools/common/exit_code.h"

namespace pelo_tool {

// The whole of a file or of standard input; complains when it cannot be read.
tool::Exit read_all(const std::string& path, std::vector<uint8_t>& bytes);

// A picture with its format and size known.
class Input {
 public:
  // Complains when the source cannot be read or holds no picture.
  tool::Exit open(const std::string& path);

  const TAVIRPELO_HINFO& header() const { return header_; }
  int format() const { return info_->imageFormat; }
  TAVIRPELO_DECINFO* info() const { return info_.get(); }

  // Decodes into `raw` as the option word says; mode is the JPEG decode mode. False when that fails.
  bool decode(TAVIRPELO_RAWINFO& raw, uint32_t option, int mode);

 private:
  std::string path_;
  std::vector<uint8_t> bytes_;  // of standard input
  tool::DecInfo info_;
  TAVIRPELO_HINFO header_{};
};

// The picture, first positional argument of every command.
CLI::Option* add_picture_argument(CLI::App& command, std::string& path);

}  // namespace pelo_tool
