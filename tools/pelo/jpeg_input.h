// The picture of a command that turns one JPEG into another.
#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "tavirpelo/tavirpelo.h"
#include "tools/pelo/commands.h"

namespace pelo_tool {

// Reads a picture that has to be a JPEG, and its size.
Exit read_jpeg(const std::string& path, std::vector<uint8_t>& bytes, TAVIRPELO_HINFO& header);

}  // namespace pelo_tool
