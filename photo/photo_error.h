#pragma once

#include <stdexcept>
#include <string>

namespace pelorin::photo {

/// Why a photo cannot be read or made; `what()` is one clause for a user, without the file's name,
/// that says what to do where there is something to do: "truncated: the picture data ends early".
///
/// Beside it `std::bad_alloc` passes through everywhere, and `std::system_error` wherever a path is
/// given.
class PhotoError : public std::runtime_error {
 public:
  enum class Kind {
    empty,           ///< No bytes at all.
    notAPhoto,       ///< Bytes of no format known here.
    unsupported,     ///< A format, or a kind of file of it, that is known but cannot be read.
    damaged,         ///< Bytes that break the rules of their format.
    truncated,       ///< The beginning of a photo.
    tooLarge,        ///< More work than the limits allow.
    invalidRequest,  ///< What is asked for does not exist: a turn by 45 degrees, a JPEG file
                     ///< 70000 pixels wide.
    stopped          ///< The caller's stop token asked for it; see Stopped.
  };

  PhotoError(Kind kind, const std::string& clause) : std::runtime_error(clause), kind_(kind) {}

  Kind kind() const { return kind_; }

 private:
  Kind kind_;
};

/// Thrown by work that ends because its stop token asked for it.
class Stopped : public PhotoError {
 public:
  Stopped() : PhotoError(Kind::stopped, "interrupted") {}
};

}  // namespace pelorin::photo
