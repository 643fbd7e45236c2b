#pragma once

#include <csetjmp>

namespace pelorin::photo {

/// The way out of a C library that must not return from an error: back into `left`, over the library's
/// frames. An exception may not cross C, but in WebAssembly, whose machine unwinds all frames alike and
/// whose compiler takes no function with exceptions that calls setjmp.
class WayOut {
 public:
  WayOut() : landing_() {}
  WayOut(const WayOut&) = delete;
  WayOut& operator=(const WayOut&) = delete;

  /// Calls `body`, in which and below which no object may need its destructor on the way out: what it owns
  /// belongs to the caller.
  /// @returns whether `take` ended it.
  template <typename Body>
  bool left(const Body& body) {
#ifdef __EMSCRIPTEN__
    try {
      body();
    } catch (const Taken&) {
      return true;
    }
#else
    if (setjmp(landing_) != 0) return true;
    body();
#endif
    return false;
  }

  /// Only while `left` runs.
  [[noreturn]] void take() {
#ifdef __EMSCRIPTEN__
    throw Taken();
#else
    std::longjmp(landing_, 1);
#endif
  }

 private:
#ifdef __EMSCRIPTEN__
  struct Taken {};
#endif
  std::jmp_buf landing_;
};

}  // namespace pelorin::photo
