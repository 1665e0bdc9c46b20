// Commands that turn one JPEG into another.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "tavirpelo/tavirpelo.h"
#include "tools/pelo/commands.h"

namespace pelo_tool {

// A block that the codec allocates, enlarges and may replace.
class CodecBuffer {
 public:
  CodecBuffer();
  ~CodecBuffer();
  CodecBuffer(const CodecBuffer&) = delete;
  CodecBuffer& operator=(const CodecBuffer&) = delete;

  uint8_t* bytes;
  int size;
};

// Reads a picture that has to be a JPEG, and its size.
Exit read_jpeg(const std::string& path, std::vector<uint8_t>& bytes, TAVIRPELO_HINFO& header);

}  // namespace pelo_tool
