// The subcommands: each file of that name adds its options to the program and, when chosen, runs.
#pragma once

#include <CLI/CLI.hpp>

#include "tools/vss/exit_code.h"

namespace vss {

void register_create(CLI::App& app, Exit& result);
void register_add(CLI::App& app, Exit& result);
void register_insert(CLI::App& app, Exit& result);
void register_remove(CLI::App& app, Exit& result);
void register_list(CLI::App& app, Exit& result);
void register_get(CLI::App& app, Exit& result);
void register_thumb(CLI::App& app, Exit& result);
void register_sheet(CLI::App& app, Exit& result);
void register_music(CLI::App& app, Exit& result);
void register_settings(CLI::App& app, Exit& result);
void register_frames(CLI::App& app, Exit& result);
void register_compact(CLI::App& app, Exit& result);

}  // namespace vss
