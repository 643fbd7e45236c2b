#include <algorithm>

#include "image_processing/core/require.h"
#include "image_processing/quality/aligned_floats.h"
#include "image_processing/quality/image_structure.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/quality/image_structure_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include "image_processing/core/simd.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::ScalableTag<float>;
using Vector = hn::Vec<Floats>;

// difference / (sqrt(|variance|) + 1)
HWY_INLINE void storeNormalised(Vector difference, Vector variance, float* out) {
  const Floats floats;
  const Vector deviation = simd::squareRoot(hn::Abs(variance));
  const Vector divisor = hn::Add(deviation, hn::Set(floats, 1.0f));
  hn::StoreU(simd::divide(difference, divisor), floats, out);
}

// Mean and mean square along the columns of the row in the middle of seven.
void filterColumns(const float* const rows[7], std::size_t width, float* means, float* squares) {
  const Floats floats;
  const std::size_t lanes = hn::Lanes(floats);
  for (std::size_t block = 0; block < width; block += lanes) {
    const std::size_t x = std::min(block, width - lanes);  // the last two vectors may overlap
    Vector mean = hn::Zero(floats), square = hn::Zero(floats);
    for (int tap = 0; tap < 7; ++tap) {
      const Vector weight = hn::Set(floats, niqeWindow[tap]);
      const Vector value = hn::LoadU(floats, rows[tap] + x);
      mean = hn::Add(mean, hn::Mul(weight, value));
      square = hn::Add(square, hn::Mul(weight, hn::Mul(value, value)));
    }
    hn::StoreU(mean, floats, means + x);
    hn::StoreU(square, floats, squares + x);
  }
}

// `means` and `squares` can be read three floats before their start and after their end.
void filterRow(const float* means, const float* squares, const float* grey, std::size_t width,
               float* structure) {
  const Floats floats;
  const std::size_t lanes = hn::Lanes(floats);
  for (std::size_t block = 0; block < width; block += lanes) {
    const std::size_t x = std::min(block, width - lanes);
    Vector mean = hn::Zero(floats), square = hn::Zero(floats);
    for (int tap = 0; tap < 7; ++tap) {
      const Vector weight = hn::Set(floats, niqeWindow[tap]);
      mean = hn::Add(mean, hn::Mul(weight, hn::LoadU(floats, means + x + tap - 3)));
      square = hn::Add(square, hn::Mul(weight, hn::LoadU(floats, squares + x + tap - 3)));
    }
    storeNormalised(hn::Sub(hn::LoadU(floats, grey + x), mean),
                    hn::Sub(square, hn::Mul(mean, mean)), structure + x);
  }
}

void replicateEnds(float* row, std::size_t width) {
  std::fill_n(row - 3, 3, row[0]);
  std::fill_n(row + width, 3, row[width - 1]);
}

void computeImageStructure_fast(const Image<float>& grey, std::uint32_t width, std::uint32_t height,
                                Image<float>& structure) {
  if (width < hn::Lanes(Floats())) return computeImageStructure(grey, width, height, structure);
  constexpr std::size_t margin = 16;  // keeps vectors within cache lines
  const std::size_t rowSize = margin + (width + 2 * margin - 1) / margin * margin;
  AlignedFloats rowBuffers(2 * rowSize);
  float* means = rowBuffers.data() + margin;
  float* squares = means + rowSize;
  for (std::uint32_t y = 0; y < height; ++y) {
    const float* rows[7];
    for (std::int64_t tap = 0; tap < 7; ++tap)
      rows[tap] = grey.row(static_cast<std::uint32_t>(
          std::clamp<std::int64_t>(y + tap - 3, 0, std::int64_t{height} - 1)));
    filterColumns(rows, width, means, squares);
    replicateEnds(means, width);
    replicateEnds(squares, width);
    filterRow(means, squares, grey.row(y), width, structure.row(y));
  }
}
}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#if HWY_ONCE
namespace pelorin::image_processing {
HWY_EXPORT(computeImageStructure_fast);
void computeImageStructure_fast(const Image<float>& grey, std::uint32_t width, std::uint32_t height,
                                Image<float>& structure) {
  require(holds(grey, width, height) && holds(structure, width, height),
          "image structure: an image is smaller than asked for");
  HWY_DYNAMIC_DISPATCH(computeImageStructure_fast)(grey, width, height, structure);
}
}  // namespace pelorin::image_processing
#endif
