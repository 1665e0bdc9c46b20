// Container files for tests: built byte by byte, read back whole, and the pictures to fill them.
#pragma once

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

#include "slideshow/SlideShow.h"
#include "tests/support/jpeg_samples.h"

namespace tests {

constexpr size_t kHeaderBytes = 628, kSubfileBytes = 540, kMarkBytes = 12;

// A file of the running test and process alone, removed at the end.
class TempFile {
 public:
  explicit TempFile(const std::string& suffix = "");
  ~TempFile();
  TempFile(const TempFile&) = delete;
  TempFile& operator=(const TempFile&) = delete;

  const char* c_str() const { return path_.c_str(); }
  const std::string& path() const { return path_; }
  Bytes read() const;
  void write(const Bytes& bytes) const;

 private:
  std::string path_;
};

int32_t number_at(const Bytes& file, size_t at);
void set_number(Bytes& file, size_t at, uint32_t value);

// A container as the format describes it, written without the library.
struct ContainerImage {
  struct Picture {
    std::string name, path;
    int width, height, state;
    Bytes jpeg;
  };
  std::string path, musicPath;
  int interval = 1, effectType = 0, shuffle = 0, loop = 0, screenDirection = 0;
  int width = 480, height = 480;
  Bytes music;
  std::vector<Picture> pictures;
  int staleMarks = 0;

  Bytes bytes() const;
};

// Names and JPEG data of a show's pictures.
using Contents = std::vector<std::pair<std::string, Bytes>>;
Contents contents(SlideShow& show);

// The same of the file, opened afresh; empty when it does not open.
Contents reopened(const TempFile& file);

// Adds a picture of that size; `position` -1 appends.
int add_sample(SlideShow& show, int width, int height, const char* name, int position = -1);

}  // namespace tests
