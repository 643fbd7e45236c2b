#include "image_processing/autoenhance/image_masks.h"

#include <algorithm>
#include <vector>

#include "image_processing/autoenhance/bilateral_filter.h"
#include "image_processing/autoenhance/bilateral_grid.h"
#include "image_processing/autoenhance/companding_steps.h"
#include "image_processing/autoenhance/face_blend.h"
#include "image_processing/autoenhance/flatness_mask.h"

namespace pelorin::image_processing {
namespace {

using Quantized = QuantizedFloat<unsigned char>;

Image<float> lightnessImage(const Image<RGBA8Pixel>& photo) {
  Image<float> lightness(photo.width, photo.height);
  const auto& ofSteps = unitLightnessOfSteps();
  std::vector<std::uint16_t> steps(photo.width);
  for (std::uint32_t y = 0; y < photo.height; ++y) {
    compandingSteps(photo.row(y), steps.data(), photo.width);
    float* const row = lightness.row(y);
    for (std::uint32_t x = 0; x < photo.width; ++x) row[x] = ofSteps[steps[x]];
  }
  return lightness;
}

}  // namespace

template <typename TB, typename TL>
void computeImageMasks(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                       const FilterConfig& config, ImageMasks<TB, TL>& masks) {
  masks.computed = false;
  masks.ltmMask = makeSharedImage<TL>(photo.width, photo.height);
  masks.bilateralMask = makeSharedImage<TB>(photo.width, photo.height);
  if (config.detailGainHigh == 0.0f) return;

  const Image<float> lightness = lightnessImage(photo);
  const float shorterSide = static_cast<float>(std::min(photo.width, photo.height));
  float spatial = shorterSide * config.bilateralSpatialFraction;
  if (!(spatial > 1.0f)) spatial = 1.0f;
  if (config.useBilateralGrid != 0) {
    bilateralFilterGridApproximation(lightness, config.bilateralRange, spatial,
                                     *masks.bilateralMask);
  } else {
    bilateralFilter(lightness, config.bilateralRange, truncateTo<std::int32_t>(spatial),
                    *masks.bilateralMask);
  }
  computeLtmMask(metadata, photo, lightness, *masks.bilateralMask, config.ltmMaskAmount,
                 config.ltmMaskRadius, *masks.ltmMask);
  masks.computed = true;
}

template <typename TB, typename TL>
void computeLtmMask(const ImageMetadata& metadata, const Image<RGBA8Pixel>& photo,
                    const Image<float>& lightness, const Image<TB>& bilateral, float amount,
                    int radius, Image<TL>& mask) {
  if (amount > 0.0f) {
    computeFlatnessMask(lightness, bilateral, radius, mask);
  } else {
    TL zero;
    zero = 0.0f;
    mask.set(zero);
  }
  for (const auto& face : metadata.faces) blendFaceIntoMask(*face, photo, mask);
}

template void computeImageMasks(const Image<RGBA8Pixel>&, const ImageMetadata&, const FilterConfig&,
                                ImageMasks<float, float>&);
template void computeImageMasks(const Image<RGBA8Pixel>&, const ImageMetadata&, const FilterConfig&,
                                ImageMasks<Quantized, Quantized>&);
template void computeLtmMask(const ImageMetadata&, const Image<RGBA8Pixel>&, const Image<float>&,
                             const Image<float>&, float, int, Image<float>&);
template void computeLtmMask(const ImageMetadata&, const Image<RGBA8Pixel>&, const Image<float>&,
                             const Image<Quantized>&, float, int, Image<Quantized>&);

}  // namespace pelorin::image_processing
