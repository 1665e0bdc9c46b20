// The records of a container file: what each field is and where it stands (docs/container.md).
#pragma once

#include <cstdint>

#include "slideshow/SlideShow.h"
#include "slideshow/container_session.h"

namespace pelo::slideshow {

constexpr int kHeaderSize = 628;         // bytes; at offset musicSize
constexpr int kSubfileHeaderSize = 540;  // bytes in front of each picture's JPEG data
constexpr int kEndMarkSize = 12;         // bytes; the last ones of the file
constexpr int32_t kVersion = 10000;

struct EndMark {
  bool magic;  // the four bytes "vssf" are there
  int version;
  int musicSize;  // bytes: the header's offset
};

// Each reads one record at the session's position, field by field in file order; 32-bit numbers are
// little-endian, text fields are terminated. Whether it worked is the session's good(); values are as
// found and still to be checked.
void read_header(ContainerSession& session, SlideShow& show);
void read_subfile_header(ContainerSession& session, subfileInfo& entry);
EndMark read_end_mark(ContainerSession& session);

// Each writes one part of the container at the place that the show gives it, and answers the session's
// good(): the bytes may still wait in the stream.
bool write_header(ContainerSession& session, const SlideShow& show);
bool write_subfile_headers(ContainerSession& session, const SlideShow& show);
bool write_subfile(ContainerSession& session, const subfileInfo& entry, const void* jpeg);

// At the session's position: an end mark stands wherever the file ends.
bool write_end_mark(ContainerSession& session, int musicSize);

}  // namespace pelo::slideshow
