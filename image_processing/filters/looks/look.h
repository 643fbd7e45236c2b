#pragma once

#include <array>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <utility>
#include <vector>

#include "image_processing/core/float_to_integer.h"
#include "image_processing/core/sampled_curve.h"
#include "image_processing/filters/looks/cubic_radial_mask.h"

namespace pelorin::image_processing {

/// The tone curve of one channel: n >= 2 outputs, meant in 0 ... 255, at equal steps over the
/// inputs 0 ... 255.
class LookCurve {
 public:
  explicit LookCurve(std::vector<float> samples)
      : samples_(std::move(samples)),
        samplesPerUnit_(static_cast<float>(samples_.size() - 1) / 255.0f) {}

  /// The output byte for a channel value. A curve value above 255 keeps its low 8 bits, one below 0
  /// and NaN give 0.
  std::uint8_t operator()(float x) const {
    const float y = applyToneCurve(x, samples_, samples_.size() - 1, samplesPerUnit_);
    return static_cast<std::uint8_t>(truncateTo<std::uint32_t>(std::floor(y)));
  }

  const std::vector<float>& samples() const { return samples_; }
  float samplesPerUnit() const { return samplesPerUnit_; }

 private:
  std::vector<float> samples_;
  float samplesPerUnit_;
};

/// What the three curves of a look receive.
enum class ChannelMix {
  none,   ///< Each its own channel.
  grey,   ///< All the same grey, mostly red.
  faded,  ///< Mostly its own channel and a little of the two others.
};

/// Channel values, or the outputs of the three curves, as floats.
struct Rgb {
  float r, g, b;
};

/// What red, green and blue count in the grey of `ChannelMix::grey`.
inline constexpr Rgb greyMix{0.8f, 0.1f, 0.1f};

/// What a curve's own channel and each of the others count in `ChannelMix::faded`.
inline constexpr float fadedOwn = 0.9f, fadedOther = 0.05f;

/// The inputs of the red, green and blue curve. Sums are formed left to right in float.
inline Rgb mixChannels(ChannelMix mix, const Rgb& c) {
  switch (mix) {
    case ChannelMix::none:
      break;
    case ChannelMix::grey: {
      const float grey = greyMix.r * c.r + greyMix.g * c.g + greyMix.b * c.b;
      return {grey, grey, grey};
    }
    case ChannelMix::faded:
      return {fadedOwn * c.r + fadedOther * c.g + fadedOther * c.b,
              fadedOther * c.r + fadedOwn * c.g + fadedOther * c.b,
              fadedOther * c.r + fadedOther * c.g + fadedOwn * c.b};
  }
  return c;
}

/// Everything one application of a look needs. Any value is allowed in the curves, in `maskRadius`
/// and in `maskAlpha`, infinities and NaN included.
struct Look {
  std::array<LookCurve, 3> curves;  ///< Red, green, blue.
  ChannelMix mix = ChannelMix::none;
  const CubicRadialMask* vignette = nullptr;  ///< Borrowed; null for a look without vignette.
  float maskRadius = 1.0f;  ///< Distance at which the mask ends, in halves of the image height.
  float maskAlpha = 1.0f;   ///< Opacity of the vignette, meant in 0 ... 1.
};

}  // namespace pelorin::image_processing
