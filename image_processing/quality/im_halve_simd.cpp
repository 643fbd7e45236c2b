#include "image_processing/quality/im_halve.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/quality/im_halve_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;

void imHalve(Image<float>& image, std::uint32_t& width, std::uint32_t& height) {
  const hn::ScalableTag<float> floats;
  const std::size_t lanes = hn::Lanes(floats);
  width /= 2;
  height /= 2;
  for (std::uint32_t y = 0; y < height; ++y) {
    const float* upper = image.row(2 * y);
    const float* lower = image.row(2 * y + 1);
    float* half = image.row(y);
    std::size_t x = 0;
    for (; x + lanes <= width; x += lanes) {
      hn::Vec<decltype(floats)> upperLeft, upperRight, lowerLeft, lowerRight;
      hn::LoadInterleaved2(floats, upper + 2 * x, upperLeft, upperRight);
      hn::LoadInterleaved2(floats, lower + 2 * x, lowerLeft, lowerRight);
      const auto sum = hn::Add(hn::Add(hn::Add(upperLeft, upperRight), lowerLeft), lowerRight);
      hn::StoreU(hn::Mul(sum, hn::Set(floats, imHalveShare)), floats, half + x);
    }
    for (; x < width; ++x)
      half[x] =
          (((upper[2 * x] + upper[2 * x + 1]) + lower[2 * x]) + lower[2 * x + 1]) * imHalveShare;
  }
}
}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#if HWY_ONCE
namespace pelorin::image_processing {
HWY_EXPORT(imHalve);
void imHalve(Image<float>& image, std::uint32_t& width, std::uint32_t& height) {
  HWY_DYNAMIC_DISPATCH(imHalve)(image, width, height);
}
}  // namespace pelorin::image_processing
#endif
