#pragma once

// jpeglib.h needs size_t and FILE from before it.
// clang-format off
#include <cstddef>
#include <cstdio>
#include <jpeglib.h>
// clang-format on
#include "photo/way_out.h"

namespace pelorin::photo {

/// Turns libjpeg's errors into exceptions: an error goes back into `run`, and `run` throws.
class LibjpegErrors {
 public:
  LibjpegErrors();
  LibjpegErrors(const LibjpegErrors&) = delete;
  LibjpegErrors& operator=(const LibjpegErrors&) = delete;

  /// For the `err` of a codec object; lives as long as this.
  jpeg_error_mgr* manager() { return &state_.base; }

  /// Calls `body`, which calls libjpeg, as `WayOut::left` does.
  /// @throws PhotoError or std::bad_alloc when libjpeg reports an error or a warning that picture
  ///         data is missing or wrong.
  template <typename Body>
  void run(const Body& body) {
    if (state_.wayOut.left(body)) throwError();
  }

 private:
  struct State {
    jpeg_error_mgr base;  // first, so that libjpeg's pointer to it is one to the whole
    WayOut wayOut;
  };

  [[noreturn]] static void jumpOut(j_common_ptr codec);
  static void jumpOutIfDamaged(j_common_ptr codec, int level);
  [[noreturn]] void throwError();

  State state_;
};

}  // namespace pelorin::photo
