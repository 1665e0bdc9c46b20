// vss music: takes a music file into the show, out of it, or writes it to a file.
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <memory>
#include <vector>

#include "tools/vss/arguments.h"
#include "tools/vss/commands.h"
#include "tools/vss/picture.h"
#include "tools/vss/show_file.h"

namespace vss {
namespace {

struct Options {
  std::string show;
  std::string file;  // the music's
};

Exit check_source(const std::string& path) {
  std::error_code error;
  const auto size = std::filesystem::file_size(path, error);
  if (error) return fail(Exit::kCannotOpen, "{}: {}", path, error.message());
  return size > 0 ? Exit::kDone : fail(Exit::kRefused, "{}: is empty", path);
}

Exit add(const Options& options) {
  SlideShow show;
  Exit result = check_source(options.file);
  if (result == Exit::kDone) result = open_show(show, options.show, Access::kEdit);
  if (result != Exit::kDone) return result;
  if (show.GetMusicSize() != 0) return fail(Exit::kRefused, "{}: has music already", options.show);
  if (show.AddMusic(options.file.c_str()) == 1) return Exit::kDone;
  return fail(Exit::kWriteFailure, "{}: cannot take in {}", options.show, options.file);
}

Exit open_with_music(SlideShow& show, const std::string& path, Access access) {
  Exit opened = open_show(show, path, access);
  if (opened != Exit::kDone || show.GetMusicSize() != 0) return opened;
  return fail(Exit::kRefused, "{}: has no music", path);
}

Exit remove(const Options& options) {
  SlideShow show;
  Exit opened = open_with_music(show, options.show, Access::kEdit);
  if (opened != Exit::kDone) return opened;
  if (show.RemoveMusic() == 1) return Exit::kDone;
  return fail(Exit::kWriteFailure, "{}: cannot be written", options.show);
}

// The music is the front of the show's file.
Exit get(const Options& options) {
  SlideShow show;
  Exit opened = open_with_music(show, options.show, Access::kRead);
  if (opened != Exit::kDone) return opened;
  std::vector<uint8_t> music(static_cast<size_t>(show.GetMusicSize()));
  std::unique_ptr<FILE, int (*)(FILE*)> stream(std::fopen(show.pathName, "rb"), std::fclose);
  if (!stream || std::fread(music.data(), 1, music.size(), stream.get()) != music.size()) {
    return fail(Exit::kCannotOpen, "{}: {}", options.show, std::strerror(errno));
  }
  return write_output(show, options.file, music.data(), music.size());
}

CLI::App* add_command(CLI::App& music, Options& options, const char* name, const char* description) {
  CLI::App* command = music.add_subcommand(name, description);
  add_show_argument(*command, options.show);
  return command;
}

}  // namespace

void register_music(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* music = app.add_subcommand("music", "Add, remove or get the show's music");
  music->require_subcommand(1);
  CLI::App* command = add_command(*music, *options, "add", "Take in a music file");
  command->add_option("file", options->file, "Music file")->required();
  command->callback([options, &result] { result = add(*options); });
  command = add_command(*music, *options, "remove", "Take the music out");
  command->callback([options, &result] { result = remove(*options); });
  command = add_command(*music, *options, "get", "Write the music to a file");
  command->add_option("output", options->file, "Music file, - for standard output")->required();
  command->callback([options, &result] { result = get(*options); });
}

}  // namespace vss
