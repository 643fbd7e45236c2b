#include "image_processing/autoenhance/lightness/lightness_histogram.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/autoenhance/lightness/lightness_histogram_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include <algorithm>

#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::CappedTag<float, 16>;
using Ints = hn::RebindToSigned<Floats>;
constexpr std::size_t lanes = hn::MaxLanes(Floats());

/// Writes the places of pairs of pixels, as many as fill vectors. @returns the pixels in them.
std::size_t findPlaces(const float* lightness, std::size_t count, std::uint16_t* places) {
  const hn::Rebind<std::uint16_t, Floats> halves;
  std::size_t i = 0;
  for (; i + 2 * lanes <= count; i += 2 * lanes) {
    // The definition divides after it multiplies; for none of the steps' lightnesses does the bin
    // differ.
    const auto bins = [&](std::size_t at) HWY_ATTR {
      const auto place = hn::Mul(hn::LoadU(Floats(), lightness + at),
                                 hn::Set(Floats(), static_cast<float>(lightnessBins - 1)));
      return simd::truncate(place);
    };
    const auto place = hn::Add(bins(i), hn::ShiftLeft<6>(bins(i + lanes)));
    hn::StoreU(hn::DemoteTo(halves, place), halves, places + i / 2);
  }
  return i;
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {

HWY_EXPORT(findPlaces);

void LightnessHistogramSimd::add(const float* lightness, std::size_t count) {
  constexpr std::size_t blockSize = 512;
  std::uint16_t places[blockSize / 2];
  std::uint64_t* const even = counts_.data();
  std::uint64_t* const odd = even + tableSize;
  while (count > 0) {
    const std::size_t size = std::min(count, blockSize);
    const std::size_t paired = HWY_DYNAMIC_DISPATCH(findPlaces)(lightness, size, places);
    std::size_t i = 0;
    for (; i + 2 <= paired / 2; i += 2) {
      ++even[places[i]];
      ++odd[places[i + 1]];
    }
    if (i < paired / 2) ++even[places[i]];
    for (std::size_t x = paired; x < size; ++x) {
      const auto bin = static_cast<std::size_t>(lightness[x] * (lightnessBins - 1));
      ++even[bin + binsHeld * (binsHeld - 1)];
    }
    lightness += size;
    count -= size;
  }
}

std::vector<std::uint64_t> LightnessHistogramSimd::counts() const {
  std::vector<std::uint64_t> bins(binsHeld);
  for (std::size_t place = 0; place < counts_.size(); ++place) {
    bins[place % binsHeld] += counts_[place];
    bins[place / binsHeld % binsHeld] += counts_[place];
  }
  bins.resize(lightnessBins);
  return bins;
}

}  // namespace pelorin::image_processing
#endif
