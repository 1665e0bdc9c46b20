// pelo shrink: a JPEG is coded again within a number of bytes.
#include <memory>

#include "tavirpelo/tavirpelo.h"
#include "tools/common/codec_objects.h"
#include "tools/common/output.h"
#include "tools/pelo/input.h"
#include "tools/pelo/jpeg_input.h"

namespace pelo_tool {
namespace {

struct Options {
  std::string picture;
  std::string output;
  int maxBytes = 0;
};

Exit run(const Options& options) {
  std::vector<uint8_t> bytes;
  TAVIRPELO_HINFO header{};
  const Exit result = read_jpeg(options.picture, bytes, header);
  if (result != Exit::kDone) return result;
  tool::CodecBuffer buffer;
  if (buffer.bytes == nullptr ||
      TAVIRPELO_ReEncodeJpegToBuffer(bytes.data(), static_cast<int>(bytes.size()), TAVIRPELO_IO_MEMORY,
                                     &buffer.bytes, &buffer.size, options.maxBytes) != 1) {
    return fail(Exit::kRefused, "{}: cannot be fitted into {} bytes", options.picture, options.maxBytes);
  }
  return tool::write_bytes(options.output, buffer.bytes, static_cast<size_t>(buffer.size));
}

}  // namespace

void register_shrink(CLI::App& app, Exit& result) {
  auto options = std::make_shared<Options>();
  CLI::App* command =
      app.add_subcommand("shrink", "Encode a JPEG again so that it takes few enough bytes");
  add_picture_argument(*command, options->picture);
  command->add_option("output", options->output, "JPEG file, - for standard output")->required();
  command->add_option("--max-bytes", options->maxBytes, "Most bytes of the result")
      ->required()
      ->check(CLI::PositiveNumber);
  command->callback([options, &result] { result = run(*options); });
}

}  // namespace pelo_tool
