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

// Of the algorithms, those that a range and a condition or value are all there is to.
namespace ranges {

template <typename Range, typename Condition, typename Projection = identity>
constexpr auto find_if(Range&& range, Condition condition, Projection projection = {}) {
  return std::find_if(std::begin(range), std::end(range), [&](auto&& element) {
    return std::invoke(condition, std::invoke(projection, element));
  });
}

template <typename Range, typename Value, typename Projection = identity>
constexpr auto find(Range&& range, const Value& value, Projection projection = {}) {
  return ranges::find_if(
      range, [&](const auto& found) { return found == value; }, projection);
}

template <typename Range, typename Condition, typename Projection = identity>
constexpr bool any_of(Range&& range, Condition condition, Projection projection = {}) {
  return ranges::find_if(range, condition, projection) != std::end(range);
}

template <typename Range, typename Condition, typename Projection = identity>
constexpr bool none_of(Range&& range, Condition condition, Projection projection = {}) {
  return !ranges::any_of(range, condition, projection);
}

template <typename Range, typename Condition, typename Projection = identity>
constexpr bool all_of(Range&& range, Condition condition, Projection projection = {}) {
  return !ranges::any_of(range, std::not_fn(condition), projection);
}

template <typename Range, typename Condition, typename Projection = identity>
constexpr auto count_if(Range&& range, Condition condition, Projection projection = {}) {
  return std::count_if(std::begin(range), std::end(range), [&](auto&& element) {
    return std::invoke(condition, std::invoke(projection, element));
  });
}

template <typename Range, typename Order = std::less<>, typename Projection = identity>
constexpr void sort(Range&& range, Order order = {}, Projection projection = {}) {
  std::sort(std::begin(range), std::end(range), [&](const auto& a, const auto& b) {
    return std::invoke(order, std::invoke(projection, a), std::invoke(projection, b));
  });
}

}  // namespace ranges
}  // namespace std
#endif
