// vss: makes, edits and reads slide-show files from the command line.
#include "tools/common/program.h"
#include "tools/vss/commands.h"

const char tool::kProgram[] = "vss";

namespace {

constexpr tool::Register kCommands[] = {
    vss::register_create, vss::register_add,      vss::register_insert,  vss::register_remove,
    vss::register_list,   vss::register_get,      vss::register_thumb,   vss::register_sheet,
    vss::register_music,  vss::register_settings, vss::register_compact, vss::register_frames,
};

}  // namespace

int main(int argc, char** argv) {
  CLI::App app{"Slide shows in one file: up to 20 pictures with settings and music.", tool::kProgram};
  app.set_version_flag("--version", "vss " VSS_VERSION);
  app.footer(tool::footer());
  return tool::run(app, kCommands, argc, argv);
}
