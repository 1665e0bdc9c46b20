// Where results go that are bytes, not text.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

#include "tools/common/exit_code.h"

namespace tool {

// Writes a file, or standard output for "-".
Exit write_bytes(const std::string& path, const uint8_t* bytes, size_t size);

}  // namespace tool
