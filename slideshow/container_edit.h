// One edit of a container: its session, and the way back should a step fail.
//
// How to read this room: include/slideshow/SlideShow.h says what a show does, and each show_*.cpp
// defines the operations of its name. The container's records stand in container_format, the table of
// pictures and their offsets in subfile_table, a picture's way from its source to stored JPEG in
// picture_intake. An edit is a ContainerEdit: one container_session, the bytes that it will overwrite in
// container_undo, what moves to make room in data_shift. show_remove.cpp is the shortest that uses all
// of it. Files and memory are reached through vss_wrappers, where tests make any call fail.
#pragma once

#include <cstdint>

#include "slideshow/SlideShow.h"
#include "slideshow/container_session.h"
#include "slideshow/container_undo.h"
#include "slideshow/data_shift.h"

namespace pelo::slideshow {

// An edit remembers what it will overwrite, plans and makes its moves, changes the show, writes the
// parts and ends in finish() or close(). When any of that fails after the first write it rolls back.
class ContainerEdit {
 public:
  explicit ContainerEdit(SlideShow& show) : show_(show), session_(show, "r+b") {}

  ContainerSession& session() { return session_; }
  DataShift& shift() { return shift_; }

  // As ContainerUndo::remember; the first step.
  [[nodiscard]] bool remember(bool withSubfileHeaders, int64_t tail) {
    return undo_.remember(session_, show_, withSubfileHeaders, tail);
  }
  // Bytes of the file before the edit.
  int64_t old_length() const { return undo_.length(); }

  // As DataShift::forth.
  [[nodiscard]] bool move(int tries, int64_t spare = 0) { return shift_.forth(session_, tries, spare); }

  // The last steps of an edit that has moved a container's contents about: writes the header, the
  // pictures' headers and an end mark at `end`, closes the file and cuts it behind the mark. Until the
  // cut everything can be put back, and when it is made nothing is left to fail. False when a step fails
  // twice.
  [[nodiscard]] bool finish(int64_t end);

  // Puts the file back as it was. Ends the session; the show is the caller's to restore.
  void roll_back();

 private:
  SlideShow& show_;
  ContainerSession session_;
  ContainerUndo undo_;
  DataShift shift_;
};

}  // namespace pelo::slideshow
