#include "image_processing/autoenhance/enhance_row.h"

#include <algorithm>
#include <cmath>

#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/colour/vibrance.h"
#include "image_processing/core/sampled_curve.h"

namespace pelorin::image_processing {

TonePass::TonePass(const std::vector<float>& unitCurve, float labScale, float vibranceGain,
                   float toneMappedShare, float gainOfDetail)
    : curve(unitCurve),
      samplesPerUnit(static_cast<float>(unitCurve.size() - 1) / labScale),
      scale(labScale),
      vibrance(vibranceGain),
      ltmBlend(toneMappedShare),
      detailGain(gainOfDetail) {
  for (float& sample : curve) sample *= scale;
  const auto moderate = [](float value) { return std::fabs(value) < 1e6f; };  // false for NaN
  ordinary = scale == labWhite && std::all_of(curve.begin(), curve.end(), moderate) &&
             curve.size() < 64 && moderate(ltmBlend) && moderate(detailGain) && vibrance >= 0.0f &&
             moderate(vibrance);
}

template <typename Mask>
void enhanceRowScalar(const TonePass& pass, const RGBA8Pixel* in, const Mask* bilateral,
                      const Mask* ltm, RGBA8Pixel* out, std::size_t count) {
  const ColourTables& tables = colourTables();
  const auto toneMapped = [&pass](float L) {
    return applyToneCurve(L, pass.curve, pass.curve.size() - 1, pass.samplesPerUnit);
  };
  for (std::size_t i = 0; i < count; ++i) {
    const RGBA8Pixel pixel = in[i];
    Lab lab = rgbToLab(tables, pixel.r, pixel.g, pixel.b);
    const float mapped = toneMapped(lab.L);
    if (bilateral == nullptr) {
      lab.L = mapped;
    } else {
      const float base = pass.scale * static_cast<float>(bilateral[i]);
      const float detail = lab.L - base;
      const float flat = ltm[i];
      const float recombined =
          flat * (pass.ltmBlend * toneMapped(base) + (1.0f - pass.ltmBlend) * mapped) +
          (1.0f - flat) * (mapped + pass.detailGain * detail);
      lab.L = std::clamp(recombined, 0.0f, pass.scale);
    }
    labToRgb(tables, lab, out[i].r, out[i].g, out[i].b);
    vibranceInRGB(pass.vibrance, out[i].r, out[i].g, out[i].b);
    out[i].a = pixel.a;
  }
}

template void enhanceRowScalar(const TonePass&, const RGBA8Pixel*, const float*, const float*,
                               RGBA8Pixel*, std::size_t);
template void enhanceRowScalar(const TonePass&, const RGBA8Pixel*,
                               const QuantizedFloat<unsigned char>*,
                               const QuantizedFloat<unsigned char>*, RGBA8Pixel*, std::size_t);

}  // namespace pelorin::image_processing
