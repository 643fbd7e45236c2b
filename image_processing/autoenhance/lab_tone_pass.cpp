#include "image_processing/autoenhance/lab_tone_pass.h"

#include <algorithm>

#include "image_processing/autoenhance/colour/lab_constants.h"
#include "image_processing/autoenhance/enhance_row.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"

namespace pelorin::image_processing {
namespace {

using Quantized = QuantizedFloat<unsigned char>;

}  // namespace

template <typename TB, typename TL>
void imageVibranceLabAndToneCurve(const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output,
                                  const FilterConfig& config, const std::vector<float>& curve,
                                  float scale, const ImageMasks<TB, TL>& masks, Workers* workers) {
  const TonePass pass(curve, scale, config.vibrance, config.ltmBlend, config.detailGain);
  const std::size_t count = std::min(source.pixelCount(), output.pixelCount());
  const bool useMasks = config.detailGainHigh != 0.0f && masks.present() &&
                        masks.bilateralMask->pixelCount() >= count &&
                        masks.ltmMask->pixelCount() >= count;
  const TB* const bilateral = useMasks ? masks.bilateralMask->data.get() : nullptr;
  const TL* const ltm = useMasks ? masks.ltmMask->data.get() : nullptr;
  const PreparedTonePass prepared(pass);
  const std::size_t parts = tasksFor(workers);
  runTasks(workers, parts, [&](std::size_t part) {
    const auto first = static_cast<std::size_t>(partStart(count, part, parts));
    const auto end = static_cast<std::size_t>(partStart(count, part + 1, parts));
    prepared.enhance(source.data.get() + first, useMasks ? bilateral + first : nullptr,
                     useMasks ? ltm + first : nullptr, output.data.get() + first, end - first);
  });
}

template <typename TB, typename TL>
void apply(const Image<RGBA8Pixel>& source, const ImageStatistics& statistics,
           const FilterConfig& config, const ImageMasks<TB, TL>& masks, Image<RGBA8Pixel>& output,
           Workers* workers) {
  const std::vector<float> curve = buildToneCurve(statistics, config);
  imageVibranceLabAndToneCurve(source, output, config, curve, labWhite, masks, workers);
}

template void imageVibranceLabAndToneCurve(const Image<RGBA8Pixel>&, Image<RGBA8Pixel>&,
                                           const FilterConfig&, const std::vector<float>&, float,
                                           const ImageMasks<float, float>&, Workers*);
template void imageVibranceLabAndToneCurve(const Image<RGBA8Pixel>&, Image<RGBA8Pixel>&,
                                           const FilterConfig&, const std::vector<float>&, float,
                                           const ImageMasks<Quantized, Quantized>&, Workers*);
template void apply(const Image<RGBA8Pixel>&, const ImageStatistics&, const FilterConfig&,
                    const ImageMasks<float, float>&, Image<RGBA8Pixel>&, Workers*);
template void apply(const Image<RGBA8Pixel>&, const ImageStatistics&, const FilterConfig&,
                    const ImageMasks<Quantized, Quantized>&, Image<RGBA8Pixel>&, Workers*);

}  // namespace pelorin::image_processing
