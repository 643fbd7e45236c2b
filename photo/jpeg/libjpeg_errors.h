#pragma once

// jpeglib.h needs size_t and FILE from before it.
// clang-format off
#include <cstddef>
#include <cstdio>
#include <jpeglib.h>
// clang-format on
#include <csetjmp>

namespace pelorin::photo {

/// Turns libjpeg's errors into exceptions. libjpeg must not return from an error and is C, which
/// an exception may not cross: an error jumps back into `run`, and `run` throws.
class LibjpegErrors {
 public:
  LibjpegErrors();
  LibjpegErrors(const LibjpegErrors&) = delete;
  LibjpegErrors& operator=(const LibjpegErrors&) = delete;

  /// For the `err` of a codec object; lives as long as this.
  jpeg_error_mgr* manager() { return &state_.base; }

  /// Calls `body`, which calls libjpeg. No object in it or below it may need its destructor: the
  /// jump skips them. What it owns belongs to the caller.
  /// @throws PhotoError or std::bad_alloc when libjpeg reports an error or a warning that picture
  ///         data is missing or wrong.
  template <typename Body>
  void run(const Body& body) {
    if (setjmp(state_.landing) != 0) throwError();
    body();
  }

 private:
  struct State {
    jpeg_error_mgr base;  // first, so that libjpeg's pointer to it is one to the whole
    std::jmp_buf landing;
  };

  [[noreturn]] static void jumpOut(j_common_ptr codec);
  static void jumpOutIfDamaged(j_common_ptr codec, int level);
  [[noreturn]] void throwError();

  State state_;
};

}  // namespace pelorin::photo
