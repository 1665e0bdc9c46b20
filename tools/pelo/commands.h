// The subcommands: each file of that name adds its options to the program and, when chosen, runs.
#pragma once

#include <CLI/CLI.hpp>

#include "tools/common/exit_code.h"

namespace pelo_tool {

using tool::Exit;
using tool::fail;

void register_info(CLI::App& app, Exit& result);
void register_exif(CLI::App& app, Exit& result);
void register_decode(CLI::App& app, Exit& result);
void register_encode(CLI::App& app, Exit& result);
void register_rotate(CLI::App& app, Exit& result);
void register_shrink(CLI::App& app, Exit& result);
void register_crop(CLI::App& app, Exit& result);
void register_scale(CLI::App& app, Exit& result);
void register_yuv2rgb(CLI::App& app, Exit& result);
void register_zoom(CLI::App& app, Exit& result);

}  // namespace pelo_tool
