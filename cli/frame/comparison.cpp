#include "cli/frame/comparison.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>
#include <memory>
#include <utility>

#include "cli/frame/interrupt.h"
#include "cli/frame/photo_files.h"
#include "cli/frame/small_picture.h"
#include "image_processing/autoenhance/lightness/build_tone_curve.h"
#include "image_processing/autoenhance/lightness/cdf.h"
#include "image_processing/autoenhance/lightness/image_statistics.h"
#include "image_processing/core/parameter_strings.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "photo/area_average.h"
#include "photo/photo_rows.h"
#include "photo/turned_image.h"

namespace pelorin::cli {

using namespace image_processing;

namespace {

using Picture = std::shared_ptr<Image<RGBA8Pixel>>;

// Reads it at a scale of its own, beside the one that `options` have.
photo::Photo openFor(std::uint32_t side, const photo::FileView& file, photo::OpenOptions options) {
  options = limited(std::move(options));
  if (!options.raw) {
    const photo::PhotoFacts facts = photo::openRows(file, options)->facts();
    options.scale = std::max(options.scale, scaleForSide({facts.width, facts.height}, side));
  }
  photo::PhotoRows rows(file, options);
  return {std::make_shared<Image<RGBA8Pixel>>(rows.picture()), rows.facts(), rows.metadata(),
          rows.faces()};
}

Picture reduced(const Picture& picture, photo::PictureSize size) {
  if (picture->width == size.width && picture->height == size.height) return picture;
  return std::make_shared<Image<RGBA8Pixel>>(photo::areaAverage(*picture, size));
}

std::vector<ComparedFace> facesOf(const ComparedFiles& files, const photo::Photo& photo,
                                  photo::PictureSize size) {
  std::vector<ComparedFace> faces;
  const float scale = static_cast<float>(files.open.scale);
  for (const Face& face : files.faces) {
    const float width = face.inPixels ? static_cast<float>(size.width) * scale : 1.0f;
    const float height = face.inPixels ? static_cast<float>(size.height) * scale : 1.0f;
    faces.push_back(
        {face.left / width, face.top / height, face.right / width, face.bottom / height, ""});
  }
  for (const photo::KnownFace& face : photo.faces) {
    if (face.right <= 0 || face.bottom <= 0 || face.left >= 1 || face.top >= 1) continue;
    faces.push_back({static_cast<float>(face.left), static_cast<float>(face.top),
                     static_cast<float>(face.right), static_cast<float>(face.bottom), face.name});
  }
  return faces;
}

ImageMetadata metadataOf(const std::vector<ComparedFace>& faces, const Image<RGBA8Pixel>& picture) {
  std::vector<Face> boxes;
  for (const ComparedFace& face : faces)
    boxes.push_back({face.left, face.top, face.right, face.bottom});
  return metadataWithFaces(boxes, picture.width, picture.height);
}

std::vector<float> lightOf(const ImageStatistics& statistics) {
  std::vector<float> histogram;
  computeHistogramFromCDF(statistics.cdf, histogram);
  return histogram;
}

std::string withSlider(const FilterParams& params, const std::string& slider) {
  std::string text;
  for (const auto& [key, value] : params.items())
    text += key + "=" + (key == "slider" ? slider : value) + ";";
  return text;
}

std::vector<SliderStep> stepsOf(Picture picture, const ImageMetadata& faces,
                                const photo::Metadata& metadata, const ComparedFiles& files,
                                photo::PictureSize size) {
  const FilterParams params(files.params);
  const float chosen = params.readFloat("slider");
  if (!std::isfinite(chosen)) return {};
  std::vector<float> sliders = {0.1f, 0.2f, 0.4f, 0.7f, 1.0f};
  if (std::find(sliders.begin(), sliders.end(), chosen) == sliders.end()) sliders.push_back(chosen);
  std::sort(sliders.begin(), sliders.end());
  FilteredImage session(picture, faces, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  const auto filtered = std::make_shared<Image<RGBA8Pixel>>(picture->width, picture->height);
  std::vector<SliderStep> steps;
  for (const float slider : sliders) {
    stopIfInterrupted();
    const std::string text = fmt::format("{}", slider);
    session.applyFilterWithParams(files.filter, withSlider(params, text), defaultFilterConfigValue,
                                  *filtered);
    steps.push_back({text, slider == chosen, smallJpeg(*reduced(filtered, size), metadata, 80)});
  }
  return steps;
}

}  // namespace

ComparisonSize comparisonSize(std::size_t photos) {
  if (photos <= 24) return {1280, 256};
  if (photos <= 100) return {800, 160};
  if (photos <= 400) return {480};
  return {256};
}

Comparison compareFiles(const ComparedFiles& files, const ComparisonSize& size) {
  constexpr int quality = 85;
  const bool changed = files.after.size() > 0;
  Comparison result = {};
  const photo::Photo before = openFor(size.side, files.before, files.open);
  photo::PictureSize whole{before.image->width, before.image->height};
  photo::Photo after;
  if (changed) {
    photo::OpenOptions plain = {.faces = false};
    if (files.open.raw) plain.raw = whole;
    after = openFor(size.side, files.after, plain);
    whole = {after.image->width, after.image->height};
  }
  result.size = whole;
  if (changed && !files.open.raw) {
    result.size = photo::turnedSize({after.facts.width, after.facts.height},
                                    photo::uprightTurn(after.facts.orientation));
  }
  result.shown = photo::fitWithin(whole, {size.side, size.side});
  const Picture small = reduced(before.image, result.shown);
  result.before = smallJpeg(*small, before.metadata, quality);
  result.faces = facesOf(files, before, result.size);
  if (!changed) return result;

  const Picture smallAfter = reduced(after.image, result.shown);
  result.after = smallJpeg(*smallAfter, after.metadata, quality);
  const ImageMetadata faces = metadataOf(result.faces, *small);
  ImageStatistics statistics;
  analyzeImage(*smallAfter, {}, statistics);
  result.lightAfter = lightOf(statistics);
  analyzeImage(*small, faces, statistics);
  result.lightBefore = lightOf(statistics);

  const FilterParams params(files.params);
  if (!params.items().contains("slider")) return result;
  FilterConfig config = defaultFilterConfigValue;
  updateFilterConfigForSliderValue(params.readFloat("slider"), &config);
  result.curve = buildToneCurve(statistics, config);
  if (size.step > 0) {
    result.steps = stepsOf(small, faces, before.metadata, files,
                           photo::fitWithin(result.shown, {size.step, size.step}));
  }
  return result;
}

}  // namespace pelorin::cli
