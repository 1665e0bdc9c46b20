// What a failed edit needs to put the container back: copies of the bytes that it overwrites, and the
// file's length.
#pragma once

#include <cstdint>

#include "slideshow/SlideShow.h"
#include "slideshow/vss_wrappers.h"

namespace pelo::slideshow {

class ContainerSession;

class ContainerUndo {
 public:
  // Copies the container's header, its picture headers if `withSubfileHeaders`, and up to `tail` bytes
  // behind the data (old end marks). To be called before the show or the file changes. False when the
  // file cannot be read or memory is short.
  [[nodiscard]] bool remember(ContainerSession& session, const SlideShow& show, bool withSubfileHeaders,
                              int64_t tail);

  // Bytes of the file as remembered.
  int64_t length() const { return length_; }

  // Writes the copies back and cuts the file to its old length. Needs no memory and no room on the disk;
  // each step is tried twice, even when another failed. Closes the session.
  void put_back(ContainerSession& session, const SlideShow& show) const;

 private:
  struct Piece {
    int64_t offset;
    int64_t size;
  };

  void add(int64_t offset, int64_t size);

  Piece pieces_[SlideShow::kMaxFileSubfiles + 2] = {};  // headers, container header and tail
  int pieceCount_ = 0;
  VssBytes bytes_;  // the pieces' bytes, one behind the other
  int64_t byteCount_ = 0;
  int64_t length_ = 0;
};

}  // namespace pelo::slideshow
