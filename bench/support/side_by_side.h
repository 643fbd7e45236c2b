#pragma once

#include <benchmark/benchmark.h>

#include <cstddef>
#include <cstdint>
#include <functional>

#include "image_processing/core/image.h"

namespace pelorin::bench {

/// How often a row's ways take turns; the median of so many is steady.
constexpr int turns = 9;

/// One row for a kernel: a copy of its picture, its definition and its variant on each
/// instruction set of interest take turns, so that what disturbs the machine disturbs them all.
/// Reports the median of each in nanoseconds a pixel, as `copy`, `scalar` and the name of the set,
/// and as `per_copy` how many copies the best set takes. Needs `UseManualTime`, which gets the time
/// of the best set.
/// @param pixels   what the times are divided by: pixels, or what else the kernel counts.
/// @param picture  `bytes` of it are copied.
/// @param scalar   may be empty.
void sideBySide(benchmark::State& state, std::uint64_t pixels, const void* picture,
                std::size_t bytes, const std::function<void()>& scalar,
                const std::function<void()>& variant);

/// The same for kernels over all pixels of `picture`.
template <typename T>
void sideBySide(benchmark::State& state, const image_processing::Image<T>& picture,
                const std::function<void()>& scalar, const std::function<void()>& variant) {
  sideBySide(state, picture.pixelCount(), picture.data.get(), picture.byteSize(), scalar, variant);
}

}  // namespace pelorin::bench
