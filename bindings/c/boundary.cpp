#include "bindings/c/boundary.h"

#include <algorithm>
#include <new>

#include "photo/photo_error.h"

namespace pelorin::c_api {
namespace {

std::int32_t kindOf(photo::PhotoError::Kind kind) {
  using Kind = photo::PhotoError::Kind;
  switch (kind) {
    case Kind::empty:
      return QUENBY_EMPTY_FILE;
    case Kind::notAPhoto:
      return QUENBY_NOT_A_PHOTO;
    case Kind::unsupported:
      return QUENBY_UNSUPPORTED;
    case Kind::damaged:
      return QUENBY_DAMAGED;
    case Kind::truncated:
      return QUENBY_TRUNCATED;
    case Kind::tooLarge:
      return QUENBY_TOO_LARGE;
    case Kind::invalidRequest:
      return QUENBY_INVALID_ARGUMENT;
    case Kind::stopped:
      return QUENBY_CANCELLED;
  }
  return QUENBY_FAILED;
}

std::int32_t tell(quenby_error* error, std::int32_t kind, const char* message) noexcept {
  if (error != nullptr) {
    error->kind = kind;
    copyText(error->message, sizeof(error->message), message);
  }
  return kind;
}

}  // namespace

void copyText(char* to, std::size_t size, const char* from) noexcept {
  std::size_t length = std::strlen(from);
  if (length >= size) {
    length = size - 1;
    // A character's first byte is no continuation, and none has more than four.
    const auto continues = [](char byte) { return (byte & 0xC0) == 0x80; };
    for (int back = 0; back < 3 && length > 0 && continues(from[length]); ++back) --length;
  }
  std::memcpy(to, from, length);
  to[length] = 0;
}

std::int32_t tellError(quenby_error* error) noexcept {
  try {
    throw;
  } catch (const photo::PhotoError& photoError) {
    return tell(error, kindOf(photoError.kind()), photoError.what());
  } catch (const std::invalid_argument& argument) {
    return tell(error, QUENBY_INVALID_ARGUMENT, argument.what());
  } catch (const std::bad_alloc&) {
    return tell(error, QUENBY_OUT_OF_MEMORY, "not enough memory");
  } catch (const std::length_error&) {
    return tell(error, QUENBY_OUT_OF_MEMORY, "not enough memory");
  } catch (const std::exception& other) {
    return tell(error, QUENBY_FAILED, other.what());
  } catch (...) {
    return tell(error, QUENBY_FAILED, "unknown error");
  }
}

}  // namespace pelorin::c_api
