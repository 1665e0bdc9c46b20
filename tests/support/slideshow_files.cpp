#include "tests/support/slideshow_files.h"

#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdio>
#include <fstream>
#include <iterator>

namespace tests {
namespace {

void put_number(Bytes& out, size_t value) {
  for (int shift = 0; shift < 32; shift += 8) out.push_back(static_cast<uint8_t>(value >> shift));
}

void put_text(Bytes& out, const std::string& text) {
  out.insert(out.end(), text.begin(), text.end());
  out.resize(out.size() + 256 - text.size());
}

void put_mark(Bytes& out, size_t musicSize) {
  for (const char c : std::string("vssf")) out.push_back(static_cast<uint8_t>(c));
  put_number(out, 10000);
  put_number(out, musicSize);
}

}  // namespace

// Tests run side by side: each has files of its own.
TempFile::TempFile(const std::string& suffix)
    : path_(testing::TempDir() + "tavir_" + std::to_string(getpid()) + suffix) {}

TempFile::~TempFile() {
  std::remove(path_.c_str());
}

Bytes TempFile::read() const {
  std::ifstream in(path_, std::ios::binary);
  return Bytes(std::istreambuf_iterator<char>(in), {});
}

// A new file each time: some file systems flush one that was cut to nothing and written again.
void TempFile::write(const Bytes& bytes) const {
  std::remove(path_.c_str());
  std::ofstream out(path_, std::ios::binary);
  out.write(reinterpret_cast<const char*>(bytes.data()), static_cast<std::streamsize>(bytes.size()));
}

int32_t number_at(const Bytes& file, size_t at) {
  uint32_t value = 0;
  for (size_t i = 0; i < 4; ++i) value |= uint32_t{file.at(at + i)} << 8 * i;
  return static_cast<int32_t>(value);
}

void set_number(Bytes& file, size_t at, uint32_t value) {
  for (size_t i = 0; i < 4; ++i) file.at(at + i) = static_cast<uint8_t>(value >> 8 * i);
}

Bytes ContainerImage::bytes() const {
  Bytes out = music;
  put_text(out, path);
  put_text(out, musicPath);
  for (const int value : {interval, effectType, shuffle, loop, screenDirection, width, height}) {
    put_number(out, static_cast<size_t>(value));
  }
  put_number(out, music.size());
  put_number(out, pictures.size());
  size_t offset = music.size() + kHeaderBytes;
  for (size_t i = 0; i < 20; ++i) {
    put_number(out, i < pictures.size() ? offset : 0);
    if (i < pictures.size()) offset += kSubfileBytes + pictures[i].jpeg.size();
  }
  for (const Picture& picture : pictures) {
    const size_t at = out.size();
    put_text(out, picture.name);
    put_text(out, picture.path);
    for (const int value : {1, 0, picture.width, picture.height, picture.state}) {
      put_number(out, static_cast<size_t>(value));
    }
    put_number(out, kSubfileBytes + picture.jpeg.size());
    put_number(out, at);
    out.insert(out.end(), picture.jpeg.begin(), picture.jpeg.end());
  }
  for (int i = 0; i <= staleMarks; ++i) put_mark(out, music.size());
  return out;
}

Contents contents(SlideShow& show) {
  Contents list;
  for (int i = 0; i < show.subfileCount; ++i) {
    Bytes jpeg(static_cast<size_t>(show.GetSizeOfSubfile(i)));
    EXPECT_EQ(1, show.GetImage(i, jpeg.data())) << i;
    list.emplace_back(show.subfiles[i].name, jpeg);
  }
  return list;
}

Contents reopened(const TempFile& file) {
  SlideShow show;
  EXPECT_EQ(1, show.OpenShow(file.c_str(), 1, 1));
  return contents(show);
}

int add_sample(SlideShow& show, int width, int height, const char* name, int position) {
  Bytes jpeg = encode_own(width, height, 80);
  const int size = static_cast<int>(jpeg.size());
  return position < 0 ? show.AddImageToBuffer(jpeg.data(), size, name)
                      : show.InsertImageToBuffer(jpeg.data(), size, name, position);
}

}  // namespace tests
