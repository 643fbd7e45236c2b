#include "image_processing/autoenhance/lab_tone_pass.h"

#include <algorithm>

#include "image_processing/autoenhance/build_tone_curve.h"
#include "image_processing/autoenhance/lab.h"
#include "image_processing/autoenhance/tone_curve.h"
#include "image_processing/autoenhance/vibrance.h"

namespace pelorin::image_processing {
namespace {

using Quantized = QuantizedFloat<unsigned char>;

class LightnessCurve {
 public:
  LightnessCurve(const std::vector<float>& curve, float scale)
      : samples_(curve), samplesPerUnit_(static_cast<float>(curve.size() - 1) / scale) {
    for (float& sample : samples_) sample *= scale;
  }

  float operator()(float L) const {
    return applyToneCurve(L, samples_, samples_.size() - 1, samplesPerUnit_);
  }

 private:
  std::vector<float> samples_;
  float samplesPerUnit_;
};

/// One pixel, `toneMapped` giving its new L from the old one.
template <typename ToneMapped>
void enhancePixel(const ColourTables& tables, const RGBA8Pixel& in, float vibrance,
                  const ToneMapped& toneMapped, RGBA8Pixel& out) {
  const std::uint8_t alpha = in.a;
  Lab lab = rgbToLab(tables, in.r, in.g, in.b);
  lab.L = toneMapped(lab.L);
  labToRgb(tables, lab, out.r, out.g, out.b);
  vibranceInRGB(vibrance, out.r, out.g, out.b);
  out.a = alpha;
}

}  // namespace

template <typename TB, typename TL>
void imageVibranceLabAndToneCurve(const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output,
                                  const FilterConfig& config, const std::vector<float>& curve,
                                  float scale, const ImageMasks<TB, TL>& masks) {
  const ColourTables& tables = colourTables();
  const LightnessCurve toneCurve(curve, scale);
  const std::size_t count = std::min(source.pixelCount(), output.pixelCount());
  const RGBA8Pixel* const in = source.data.get();
  RGBA8Pixel* const out = output.data.get();

  if (config.detailGainHigh == 0.0f || !masks.computed) {
    for (std::size_t i = 0; i < count; ++i) {
      enhancePixel(tables, in[i], config.vibrance, toneCurve, out[i]);
    }
    return;
  }

  const TB* const bilateral = masks.bilateralMask->data.get();
  const TL* const ltm = masks.ltmMask->data.get();
  for (std::size_t i = 0; i < count; ++i) {
    const float base = scale * static_cast<float>(bilateral[i]);
    const float flat = static_cast<float>(ltm[i]);
    const auto toneMapped = [&](float L) {
      const float detail = L - base;
      const float mapped = toneCurve(L);
      const float recombined =
          flat * (config.ltmBlend * toneCurve(base) + (1.0f - config.ltmBlend) * mapped) +
          (1.0f - flat) * (mapped + config.detailGain * detail);
      return std::clamp(recombined, 0.0f, scale);
    };
    enhancePixel(tables, in[i], config.vibrance, toneMapped, out[i]);
  }
}

template <typename TB, typename TL>
void apply(const Image<RGBA8Pixel>& source, const ImageStatistics& statistics,
           const FilterConfig& config, const ImageMasks<TB, TL>& masks, Image<RGBA8Pixel>& output) {
  const std::vector<float> curve = buildToneCurve(statistics, config);
  imageVibranceLabAndToneCurve(source, output, config, curve, 100.0f, masks);
}

template void imageVibranceLabAndToneCurve(const Image<RGBA8Pixel>&, Image<RGBA8Pixel>&,
                                           const FilterConfig&, const std::vector<float>&, float,
                                           const ImageMasks<float, float>&);
template void imageVibranceLabAndToneCurve(const Image<RGBA8Pixel>&, Image<RGBA8Pixel>&,
                                           const FilterConfig&, const std::vector<float>&, float,
                                           const ImageMasks<Quantized, Quantized>&);
template void apply(const Image<RGBA8Pixel>&, const ImageStatistics&, const FilterConfig&,
                    const ImageMasks<float, float>&, Image<RGBA8Pixel>&);
template void apply(const Image<RGBA8Pixel>&, const ImageStatistics&, const FilterConfig&,
                    const ImageMasks<Quantized, Quantized>&, Image<RGBA8Pixel>&);

}  // namespace pelorin::image_processing
