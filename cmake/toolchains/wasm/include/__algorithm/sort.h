// std::sort as one function for lists of whatever they are, for a C++ library that has kilobytes for each kind.
#pragma once
#define sort sort_of_one_kind
#include_next <__algorithm/sort.h>
#undef sort
#include <cstddef>
#include <iterator>
#include <utility>

namespace wasm {

/// A list that is seen as places from 0.
struct Places {
  void* list;
  bool (*isBefore)(void* list, std::size_t a, std::size_t b);
  void (*swap)(void* list, std::size_t a, std::size_t b);
};

/// By a heap: n log n steps whatever the order is, and no memory.
[[gnu::noinline]] inline void sort(const Places& places, std::size_t count) {
  const auto sink = [&](std::size_t place, std::size_t end) {
    for (std::size_t child; (child = 2 * place + 1) < end; place = child) {
      if (child + 1 < end && places.isBefore(places.list, child, child + 1)) ++child;
      if (!places.isBefore(places.list, place, child)) return;
      places.swap(places.list, place, child);
    }
  };
  for (std::size_t place = count / 2; place-- > 0;) sink(place, count);
  for (std::size_t end = count; end-- > 1;) {
    places.swap(places.list, 0, end);
    sink(0, end);
  }
}

}  // namespace wasm

namespace std {

template <typename Iterator, typename Before>
void sort(Iterator first, Iterator last, Before before) {
  struct List {
    Iterator first;
    Before before;
  } list{first, before};
  wasm::sort({&list,
              [](void* of, size_t a, size_t b) {
                List& list = *static_cast<List*>(of);
                return static_cast<bool>(list.before(list.first[a], list.first[b]));
              },
              [](void* of, size_t a, size_t b) {
                const Iterator first = static_cast<List*>(of)->first;
                swap(first[a], first[b]);
              }},
             static_cast<size_t>(last - first));
}

template <typename Iterator>
void sort(Iterator first, Iterator last) {
  sort(first, last, __less<typename iterator_traits<Iterator>::value_type>());
}

}  // namespace std
