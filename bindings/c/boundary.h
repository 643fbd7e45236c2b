#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <optional>
#include <stdexcept>
#include <stop_token>
#include <string>
#include <utility>

#include "bindings/c/quenby/quenby.h"
#include "photo/time_limit.h"

struct quenby_cancel {
  std::stop_source source = {};
  std::optional<pelorin::photo::TimeLimit> limit = {};  ///< Follows the source, where it is there.
};

namespace pelorin::c_api {

/// Copies a text, cut before the first character that does not fit. @param size  at least 1.
void copyText(char* to, std::size_t size, const char* from) noexcept;

template <std::size_t size>
void copyText(char (&to)[size], const std::string& from) noexcept {
  copyText(to, size, from.c_str());
}

/// Tells the exception that is being handled. @returns its kind.
std::int32_t tellError(quenby_error* error) noexcept;

/// What every function that can fail does: nothing that C++ throws leaves it.
template <typename Body>
std::int32_t guarded(quenby_error* error, const Body& body) noexcept {
  try {
    body();
  } catch (...) {
    return tellError(error);
  }
  if (error != nullptr) {
    error->kind = QUENBY_OK;
    error->message[0] = 0;
  }
  return QUENBY_OK;
}

// What is wrong with arguments. @throws std::invalid_argument that names them.

[[noreturn]] inline void refuse(const std::string& name, const std::string& why) {
  throw std::invalid_argument(name + ": " + why);
}

template <typename T>
T& required(T* pointer, const char* name) {
  if (pointer == nullptr) refuse(name, "is null");
  return *pointer;
}

/// An array of the caller's, which may be null when it is empty.
template <typename T>
T* array(T* first, std::size_t count, const char* name) {
  if (first == nullptr && count > 0) refuse(name, "is null");
  if (count > static_cast<std::size_t>(PTRDIFF_MAX) / sizeof(T)) {
    refuse(name, "are more than fit into memory");
  }
  return first;
}

/// How far a struct's fields reach that the first library of this ABI knew; beyond it a caller may
/// have fewer.
template <typename T>
constexpr std::size_t oldestSize = sizeof(T);
template <>
inline constexpr std::size_t oldestSize<quenby_open_options> = offsetof(quenby_open_options,
                                                                        workers);
template <>
inline constexpr std::size_t oldestSize<quenby_save_options> = offsetof(quenby_save_options, keep);
template <>
inline constexpr std::size_t oldestSize<quenby_facts> = offsetof(quenby_facts, last_edit);

/// No struct of any caller is so large.
constexpr std::size_t largestStruct = 4096;

template <typename T>
void checkStructSize(const T& given, const char* name) {
  if (given.struct_size < oldestSize<T> || given.struct_size > largestStruct) {
    refuse(name, "struct_size is not the size of the struct");
  }
}

/// Options as this library knows them; the defaults for null.
template <typename T>
T optionsOf(const T* given, const char* name) {
  T options{};
  options.struct_size = sizeof(T);
  if (given == nullptr) return options;
  checkStructSize(*given, name);
  const auto* const bytes = reinterpret_cast<const unsigned char*>(given);
  for (std::size_t i = sizeof(T); i < given->struct_size; ++i) {
    if (bytes[i] != 0) refuse(name, "asks for what this version of the library does not know");
  }
  std::memcpy(&options, given, std::min(sizeof(T), given->struct_size));
  return options;
}

/// A struct for the caller with room for a newer or older one's fields.
template <typename T>
void give(T* to, T value, const char* name) {
  checkStructSize(required(to, name), name);
  value.struct_size = to->struct_size;
  std::memcpy(to, &value, std::min(sizeof(T), to->struct_size));
}

inline std::stop_token tokenOf(const quenby_cancel* cancel) {
  if (cancel == nullptr) return {};
  return cancel->limit ? cancel->limit->token() : cancel->source.get_token();
}

}  // namespace pelorin::c_api
