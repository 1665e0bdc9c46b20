// Puts a container back as it was before an edit that failed.
#pragma once

#include <cstdint>

#include "slideshow/SlideShow.h"
#include "slideshow/vss_wrappers.h"

namespace pelo::slideshow {

// Holds the header, the bytes behind the last picture that an edit overwrites, and the file's length.
class ContainerBackup {
 public:
  // Reads them; `overwritten` is how far behind the last picture the edit writes.
  [[nodiscard]] bool take(SlideShow& show, int64_t overwritten);

  // Writes them back. The show's fields must be those of before the edit.
  void restore(SlideShow& show) const;

 private:
  VssBytes header_;
  VssBytes tail_;
  int64_t tailSize_ = 0;
  int64_t length_ = 0;
};

}  // namespace pelo::slideshow
