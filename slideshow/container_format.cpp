#include "slideshow/container_format.h"

#include <cstddef>

#include "codec/base/byte_order.h"

namespace pelo::slideshow {
namespace {

constexpr char kMagic[4] = {'v', 's', 's', 'f'};
constexpr size_t kOffsetCount = SlideShow::kMaxFileSubfiles;

static_assert(2 * kTextSize + 9 * 4 + kOffsetCount * 4 == kHeaderSize);
static_assert(2 * kTextSize + 7 * 4 == kSubfileHeaderSize);
static_assert(sizeof kMagic + 2 * 4 == kEndMarkSize);

// Two sides of one transfer: a field list runs over either.
struct FieldWriter {
  ContainerSession& session;

  void text(const char (&field)[kTextSize]) { session.write(field, kTextSize); }
  void number(int value) {
    uint8_t bytes[4];
    store_le32(bytes, static_cast<uint32_t>(value));
    session.write(bytes, sizeof bytes);
  }
  void numbers(const int (&values)[kOffsetCount]) {
    uint8_t bytes[kOffsetCount * 4];
    for (size_t i = 0; i < kOffsetCount; ++i)
      store_le32(bytes + i * 4, static_cast<uint32_t>(values[i]));
    session.write(bytes, sizeof bytes);
  }
};

struct FieldReader {
  ContainerSession& session;

  // A foreign file need not terminate its text.
  void text(char (&field)[kTextSize]) {
    session.read(field, kTextSize);
    field[kTextSize - 1] = '\0';
  }
  void number(int& value) {
    uint8_t bytes[4] = {};
    session.read(bytes, sizeof bytes);
    value = static_cast<int>(load_le32(bytes));
  }
  void numbers(int (&values)[kOffsetCount]) {
    uint8_t bytes[kOffsetCount * 4] = {};
    session.read(bytes, sizeof bytes);
    for (size_t i = 0; i < kOffsetCount; ++i) values[i] = static_cast<int>(load_le32(bytes + i * 4));
  }
};

template <class Fields, class Show>
void header_fields(Fields fields, Show& show) {
  fields.text(show.pathName);
  fields.text(show.musicName);
  fields.number(show.interval);
  fields.number(show.effectType);
  fields.number(show.shuffle);
  fields.number(show.loop);
  fields.number(show.screenDirection);
  fields.number(show.width);
  fields.number(show.height);
  fields.number(show.musicSize);
  fields.number(show.subfileCount);
  fields.numbers(show.subfileOffsets);
}

template <class Fields, class Entry>
void subfile_fields(Fields fields, Entry& entry) {
  fields.text(entry.name);
  fields.text(entry.path);
  fields.number(entry.flag);
  fields.number(entry.reserved);
  fields.number(entry.width);
  fields.number(entry.height);
  fields.number(entry.state);
  fields.number(entry.size);
  fields.number(entry.offset);
}

}  // namespace

void read_header(ContainerSession& session, SlideShow& show) {
  header_fields(FieldReader{session}, show);
}

void read_subfile_header(ContainerSession& session, subfileInfo& entry) {
  subfile_fields(FieldReader{session}, entry);
}

EndMark read_end_mark(ContainerSession& session) {
  EndMark mark{true, 0, 0};
  for (const char expected : kMagic) {
    char byte = 0;
    session.read(&byte, 1);
    mark.magic = mark.magic && byte == expected;
  }
  FieldReader fields{session};
  fields.number(mark.version);
  fields.number(mark.musicSize);
  return mark;
}

bool write_header(ContainerSession& session, const SlideShow& show) {
  session.seek(show.musicSize);
  header_fields(FieldWriter{session}, show);
  return session.good();
}

bool write_subfile_headers(ContainerSession& session, const SlideShow& show) {
  session.seek(int64_t{show.musicSize} + kHeaderSize);
  for (int i = 0; session.good() && i < show.subfileCount; ++i) {
    subfile_fields(FieldWriter{session}, show.subfiles[i]);
    session.skip(int64_t{show.subfiles[i].size} - kSubfileHeaderSize);
  }
  return session.good();
}

bool write_subfile(ContainerSession& session, const subfileInfo& entry, const void* jpeg) {
  session.seek(entry.offset);
  subfile_fields(FieldWriter{session}, entry);
  return session.write(jpeg, int64_t{entry.size} - kSubfileHeaderSize);
}

bool write_end_mark(ContainerSession& session, int musicSize) {
  for (const char byte : kMagic) session.write(&byte, 1);
  FieldWriter fields{session};
  fields.number(kVersion);
  fields.number(musicSize);
  return session.good();
}

}  // namespace pelo::slideshow
