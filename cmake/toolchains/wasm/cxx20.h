// What Emscripten's C++ library (LLVM 13) lacks of C++20 and this project uses; included before every
// source. With a newer library nothing of it is left.
#if __cplusplus >= 202002L && __has_include(<__config>)
#include <__config>
#endif
#if __cplusplus >= 202002L && _LIBCPP_VERSION < 15000
#pragma once
#include <algorithm>
#include <functional>
#include <iterator>
#include <type_traits>

namespace std {

#if _LIBCPP_VERSION < 14000
template <typename To, typename From>
constexpr To bit_cast(const From& from) noexcept {
  static_assert(sizeof(To) == sizeof(From));
  return __builtin_bit_cast(To, from);
}
#endif

namespace ranges {

template <typename Range, typename Value, typename Projection = identity>
constexpr auto find(Range&& range, const Value& value, Projection projection = {}) {
  return std::find_if(std::begin(range), std::end(range), [&](const auto& element) {
    return std::invoke(projection, element) == value;
  });
}

template <typename Range, typename Condition>
constexpr bool all_of(Range&& range, Condition condition) {
  return std::all_of(std::begin(range), std::end(range), condition);
}

template <typename Range, typename Condition>
constexpr bool none_of(Range&& range, Condition condition) {
  return std::none_of(std::begin(range), std::end(range), condition);
}

}  // namespace ranges
}  // namespace std
#endif
