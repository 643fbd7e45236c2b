#include "image_processing/autoenhance/auto_enhance_filter.h"

#include <algorithm>
#include <stdexcept>

#include "image_processing/autoenhance/enhance_rows.h"
#include "image_processing/autoenhance/lab_tone_pass.h"
#include "image_processing/autoenhance/photo_analysis.h"
#include "image_processing/core/parameter_strings.h"
#include "image_processing/core/work_stopped.h"
#include "image_processing/filters/through_picture.h"

namespace pelorin::image_processing {
namespace {

template <typename T>
std::shared_ptr<Image<float>> asFloats(const Image<T>& mask) {
  auto floats = makeSharedImage<float>(mask.width, mask.height);
  std::copy_n(mask.data.get(), mask.pixelCount(), floats->data.get());
  return floats;
}

}  // namespace

template <typename TB, typename TL>
FilterParameters AEFilterT<TB, TL>::parameters() {
  return {.rows = {{.name = "slider",
                    .kind = ParameterKind::number,
                    .description = "Strength of the enhancement",
                    .lowest = 0.0f,
                    .highest = 1.0f,
                    .standard = 0.4f,
                    .required = true},
                   {.name = "gtmOnly",
                    .kind = ParameterKind::boolean,
                    .description = "One tone curve for the whole picture, without local masks",
                    .standard = 0.0f},
                   {.name = "gtmExtraMemory",
                    .kind = ParameterKind::boolean,
                    .description = "Memory for the local masks all the same, which stay unused",
                    .standard = 0.0f,
                    .onlyWith = "gtmOnly"}},
          .reader = ParameterReader::filterParams,
          .readsFaces = true};
}

template <typename TB, typename TL>
std::unique_ptr<RowFilter> AEFilterT<TB, TL>::forRows(const RowRequest& request) {
  if (request.config.useBilateralGrid != 0) return enhanceRowFilter<TB>(request);
  // The exact filter's windows are a good part of the picture.
  return throughPicture(
      [](std::shared_ptr<FilteredImageState>& state) { return std::make_unique<AEFilterT>(state); },
      request);
}

template <typename TB, typename TL>
void AEFilterT<TB, TL>::init(const std::string& params) {
  masks_ = {};
  try {
    prepare(FilterParams(params));
  } catch (const WorkStopped&) {
    throw;
  } catch (...) {
    // Statistics come first and outlive what fails after them; they wait for the masks only because
    // both are found from the photo's lightness.
    masks_ = {};
    analyzeImage(*state->image, state->metadata, statistics_);
    throw;
  }
}

template <typename TB, typename TL>
void AEFilterT<TB, TL>::prepare(const FilterParams& options) {
  const Image<RGBA8Pixel>& photo = *state->image;
  if (!options.readBool("gtmOnly")) {
    prepareImage(photo, state->metadata, state->config, statistics_, masks_, state->workers);
    return;
  }
  statistics_ = analysePhoto(photo, state->metadata, state->workers);
  if (options.readBool("gtmExtraMemory")) allocateImageMasks(photo, masks_);
}

template <typename TB, typename TL>
void AEFilterT<TB, TL>::applyConfig(const std::string& params, const FilterConfig& config,
                                    Image<RGBA8Pixel>& output) {
  const FilterParams options(params);
  FilterConfig adjusted = config;
  updateFilterConfigForSliderValue(options.readFloat("slider"), &adjusted);
  if (options.readBool("gtmOnly")) adjusted.detailGainHigh = 0.0f;
  apply(*state->image, statistics_, adjusted, masks_, output, state->workers);
}

template <typename TB, typename TL>
std::shared_ptr<Image<float>> AEFilterT<TB, TL>::getBilateralMask() const {
  if (!masks_.present()) throw std::logic_error("the bilateral mask was never computed");
  return asFloats(*masks_.bilateralMask);
}

template <typename TB, typename TL>
std::shared_ptr<Image<float>> AEFilterT<TB, TL>::getLtmMask() const {
  if (!masks_.present()) throw std::logic_error("the LTM mask was never computed");
  return asFloats(*masks_.ltmMask);
}

template class AEFilterT<float, float>;
template class AEFilterT<QuantizedFloat<unsigned char>, QuantizedFloat<unsigned char>>;

}  // namespace pelorin::image_processing
