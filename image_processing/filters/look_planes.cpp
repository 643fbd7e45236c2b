#include "image_processing/filters/look_planes.h"

#include <algorithm>
#include <cmath>

#include "image_processing/filters/look_blocks.h"
#include "image_processing/filters/soft_light.h"

namespace pelorin::image_processing {
namespace {

using Plane = std::array<float, lookBlock>;

bool liesIn(float value, float lowest, float highest) {
  return lowest <= value && value <= highest;  // false for NaN
}

template <ChannelMix mix>
void mixPlanes(Plane& r, Plane& g, Plane& b, std::size_t count) {
  for (std::size_t i = 0; i < count; ++i) {
    const Rgb mixed = mixChannels(mix, {r[i], g[i], b[i]});
    r[i] = mixed.r;
    g[i] = mixed.g;
    b[i] = mixed.b;
  }
}

void applyCurve(const std::vector<CurveSegment>& segments, float samplesPerUnit,
                const Plane& values, std::uint8_t* bytes, std::size_t count) {
  const CurveSegment* const first = segments.data();
  const std::int32_t last = static_cast<std::int32_t>(segments.size()) - 1;
  // Three loops, since the one in the middle is the one that no compiler puts into vectors.
  std::array<std::int32_t, lookBlock> index;
  Plane fraction, lower, upper;
  for (std::size_t i = 0; i < count; ++i) {
    const float position = values[i] * samplesPerUnit;
    index[i] = static_cast<std::int32_t>(position);
    fraction[i] = position - static_cast<float>(index[i]);
  }
  for (std::size_t i = 0; i < count; ++i) {
    const CurveSegment segment = first[std::min(index[i], last)];
    lower[i] = segment.lower;
    upper[i] = segment.upper;
  }
  for (std::size_t i = 0; i < count; ++i) {
    const float y = fraction[i] * upper[i] + (1.0f - fraction[i]) * lower[i];
    bytes[i] = static_cast<std::uint8_t>(static_cast<std::int32_t>(std::max(y, 0.0f)));
  }
}

}  // namespace

bool LookPlanes::canCompute(const Look& look) {
  if (look.vignette != nullptr) {
    if (!liesIn(look.maskAlpha, 0.0f, 1.0f)) return false;
    // The cubic misses the edge value by a residual; this much still keeps values above 0.
    for (const float mask : look.vignette->samples()) {
      if (!liesIn(mask, -0.001f, 1.001f)) return false;
    }
  }
  for (const LookCurve& curve : look.curves) {
    if (curve.samples().size() > 65536) return false;
    for (const float sample : curve.samples()) {
      if (!liesIn(sample, -0x1p20f, 0x1p20f)) return false;
    }
  }
  return true;
}

LookPlanes::LookPlanes(const Look& look) : look_(look) {
  for (std::size_t c = 0; c < segments_.size(); ++c) {
    const std::vector<float>& samples = look.curves[c].samples();
    for (std::size_t i = 0; i < samples.size(); ++i) {
      segments_[c].push_back({samples[i], samples[std::min(i + 1, samples.size() - 1)]});
    }
  }
}

void LookPlanes::apply(const RGBA8Pixel* from, RGBA8Pixel* to, std::size_t count,
                       const std::int32_t* maskSamples) const {
  if (count == 0) return;
  Plane r, g, b;
  for (std::size_t i = 0; i < count; ++i) {
    r[i] = static_cast<float>(from[i].r);
    g[i] = static_cast<float>(from[i].g);
    b[i] = static_cast<float>(from[i].b);
  }
  if (look_.vignette != nullptr) {
    Plane mask;
    for (std::size_t i = 0; i < count; ++i) mask[i] = look_.vignette->samples()[maskSamples[i]];
    const float opacity = look_.maskAlpha;
    for (Plane* const plane : {&r, &g, &b}) {
      float* const values = plane->data();
      for (std::size_t i = 0; i < count; ++i) {
        values[i] = vignetteChannel(values[i], mask[i], opacity);
      }
    }
  }
  if (look_.mix == ChannelMix::grey) mixPlanes<ChannelMix::grey>(r, g, b, count);
  if (look_.mix == ChannelMix::faded) mixPlanes<ChannelMix::faded>(r, g, b, count);
  std::array<std::array<std::uint8_t, lookBlock>, 3> bytes;
  applyCurve(segments_[0], look_.curves[0].samplesPerUnit(), r, bytes[0].data(), count);
  applyCurve(segments_[1], look_.curves[1].samplesPerUnit(), g, bytes[1].data(), count);
  applyCurve(segments_[2], look_.curves[2].samplesPerUnit(), b, bytes[2].data(), count);
  for (std::size_t i = 0; i < count; ++i) {
    to[i] = {bytes[0][i], bytes[1][i], bytes[2][i], from[i].a};
  }
}

}  // namespace pelorin::image_processing
