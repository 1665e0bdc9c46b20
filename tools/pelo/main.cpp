// pelo: the image codec from the command line.
#include "platform/android_log.h"
#include "tools/common/program.h"
#include "tools/pelo/commands.h"

const char tool::kProgram[] = "pelo";

namespace {

constexpr tool::Register kCommands[] = {
    pelo_tool::register_info,   pelo_tool::register_exif,   pelo_tool::register_decode,
    pelo_tool::register_encode, pelo_tool::register_rotate, pelo_tool::register_shrink,
    pelo_tool::register_crop,   pelo_tool::register_scale,  pelo_tool::register_yuv2rgb,
    pelo_tool::register_zoom,
};

// The codec's log lines are for its developers; messages say what its callers need.
void set_log(bool wanted) {
#ifndef __ANDROID__
  constexpr pelo::platform::LogSink kDiscard = [](const char*) {};
  pelo::platform::set_log_sink(wanted ? nullptr : kDiscard);
#else
  static_cast<void>(wanted);
#endif
}

}  // namespace

int main(int argc, char** argv) {
  CLI::App app{"Measures, decodes and encodes pictures.", tool::kProgram};
  app.set_version_flag("--version", "pelo " PELO_VERSION);
  app.add_flag_function(
      "--log", [](int64_t) { set_log(true); }, "Let the codec's log through, to standard error");
  app.footer(tool::footer() + "\nA picture or file named - is standard input or output.");
  set_log(false);
  return tool::run(app, kCommands, argc, argv);
}
