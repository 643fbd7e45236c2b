#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <functional>
#include <initializer_list>

#include "image_processing/core/workers.h"

namespace pelorin::image_processing {

/// What is done to every band of a picture at one point of its way. The bands come in order, each
/// after the stage before has had it.
struct Stage {
  std::size_t tasks;  ///< That a band is divided into; they may run at the same time.
  std::function<void(std::int64_t band, std::size_t task)> work;
};

/// How many bands are under way at once: the first stage has one of them when the last has the one
/// that came so much earlier, less one.
inline std::int64_t bandsUnderWay(std::size_t stages, const Workers* workers) {
  return tasksFor(workers) == 1 ? 1 : static_cast<std::int64_t>(stages);
}

/// Rows of a band that is worth sharing among workers: few, so that they stay near the processor,
/// but enough for the workers to be busy longer than it takes to gather them. A multiple of 16.
inline std::uint32_t sharedBandHeight(std::uint32_t width, std::uint32_t height) {
  constexpr std::uint32_t pixels = 1 << 17, step = 16, leastBands = 8;
  const std::uint32_t rows = std::min(pixels / std::max(width, 1u), height / leastBands);
  return std::max(rows / step * step, step);
}

/// Takes bands 0 ... `bands` - 1 through all stages. With several workers every stage is at work on
/// another band at the same time, else a band is done, on this thread, before the next one begins.
/// @param stop  asked before each step whether to give up; may be empty.
/// @returns false when it gave up.
/// @throws what a stage throws, and what the workers do; std::bad_alloc.
bool runStages(std::int64_t bands, std::initializer_list<Stage> stages, Workers* workers,
               const std::function<bool()>& stop = {});

}  // namespace pelorin::image_processing
