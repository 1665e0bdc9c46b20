// The calling thread's account of its last failure: what sources and detection say. The decoders'
// reasons are tested with the decoders.
#include <string>

#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

TAVIRPELO_ERROR last_error() {
  TAVIRPELO_ERROR error;
  const int failed = TAVIRPELO_LastError(&error);
  EXPECT_EQ(error.reason != TAVIRPELO_REASON_NONE, failed == 1);
  EXPECT_EQ(failed, TAVIRPELO_LastError(nullptr));
  return error;
}

TAVIRPELO_ERROR error_of_bytes(std::string head) {
  Bytes file(head.begin(), head.end());
  file.resize(64);
  TAVIRPELO_HINFO header;
  TAVIRPELO_ParseFromBuffer(file.data(), static_cast<int>(file.size()), &header);
  return last_error();
}

TEST(Errors, SourcesThatDoNotOpen) {
  const TempFile empty;
  empty.write({});
  const struct {
    const char* path;
    int reason;
  } cases[] = {{"no/such/file", TAVIRPELO_REASON_NOT_FOUND},
               {"/", TAVIRPELO_REASON_NOT_A_FILE},
               {"/dev/null", TAVIRPELO_REASON_NOT_A_FILE},
               {empty.c_str(), TAVIRPELO_REASON_EMPTY}};
  for (const auto& c : cases) {
    TAVIRPELO_HINFO header;
    EXPECT_EQ(0, TAVIRPELO_ParseFromFile(c.path, &header));
    const TAVIRPELO_ERROR error = last_error();
    EXPECT_EQ(c.reason, error.reason) << c.path;
    EXPECT_STREQ(TAVIRPELO_ErrorText(c.reason), error.text);
    EXPECT_STREQ("opening the source", error.stage);
  }
}

TEST(Errors, FormatsThatAreNotReadHaveNames) {
  using namespace std::string_literals;
  const std::pair<std::string, const char*> cases[] = {{"\0\0\0\x18"s + "ftypheic", "HEIC"},
                                                       {"\0\0\0\x20"s + "ftypavif", "AVIF"},
                                                       {"RIFF1234WEBP", "WebP"},
                                                       {"II*\0"s, "TIFF"},
                                                       {"\0\0\0\x20"s + "ftypisom", "MP4"},
                                                       {"\0\0\0\x14"s + "ftypqt  ", "MOV"},
                                                       {"%PDF-1.7", "PDF"},
                                                       {"<svg xmlns", "SVG"}};
  for (const auto& [head, name] : cases) {
    const TAVIRPELO_ERROR error = error_of_bytes(head);
    EXPECT_EQ(TAVIRPELO_REASON_FOREIGN_FORMAT, error.reason) << name;
    EXPECT_EQ(std::string(name) + ", which is not read", error.text);
  }
  EXPECT_EQ(TAVIRPELO_REASON_UNKNOWN_FORMAT, error_of_bytes("just text").reason);
  EXPECT_EQ(TAVIRPELO_REASON_UNKNOWN_FORMAT, error_of_bytes("MMs are sweets").reason);
  EXPECT_EQ(TAVIRPELO_REASON_TRUNCATED, error_of_bytes("GIF89a").reason);
  EXPECT_STREQ("unknown error", TAVIRPELO_ErrorText(99));
}

TEST(Errors, EveryOperationBeginsWithoutOne) {
  EXPECT_EQ(nullptr, TAVIRPELO_CreateRawInfo(6000, 40, TAVIRPELO_RGB888));
  const TAVIRPELO_ERROR error = last_error();
  EXPECT_EQ(TAVIRPELO_REASON_TOO_LARGE, error.reason);
  EXPECT_STREQ("6000x40, more than 5000 pixels a side", error.text);
  Bytes jpeg = encode_own(16, 16, 90);
  TAVIRPELO_HINFO header;
  EXPECT_EQ(1, TAVIRPELO_ParseFromBuffer(jpeg.data(), static_cast<int>(jpeg.size()), &header));
  EXPECT_EQ(TAVIRPELO_REASON_NONE, last_error().reason);

  EXPECT_EQ(0, TAVIRPELO_DecodeImageFromBuffer(nullptr, 0, nullptr, 0));
  EXPECT_EQ(TAVIRPELO_WORD_CODEC, last_error().word);
  EXPECT_EQ(TAVIRPELO_CODEC_ARGUMENT, last_error().code);
}

}  // namespace
}  // namespace tests
