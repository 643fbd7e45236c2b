#include "image_processing/filters/filtered_image.h"

#include <stdexcept>
#include <utility>

namespace pelorin::image_processing {

FilteredImage::FilteredImage(std::shared_ptr<Image<RGBA8Pixel>>& image,
                             const ImageMetadata& metadata, const std::string& sessionName,
                             const FilterConfig& config, std::shared_ptr<FilterFactory> factory,
                             Workers* workers)
    : state_(std::make_shared<FilteredImageState>(
          FilteredImageState{image, metadata, sessionName, config, workers})),
      factory_(std::move(factory)) {}

std::shared_ptr<AbstractFilter> FilteredImage::setupFilter(const std::string& name,
                                                           const std::string& params) {
  {
    const std::lock_guard lock(mutex_);
    const auto cached = filters_.find(name);
    if (cached != filters_.end()) return cached->second;
  }
  const FilterDescription* description = factory_->find(name);
  if (description == nullptr) return nullptr;
  std::shared_ptr<AbstractFilter> filter = description->makeFilter(state_);
  filter->init(params);
  const std::lock_guard lock(mutex_);
  // Two threads may get here with one name: each applies its own filter, the cache keeps the last.
  filters_[name] = filter;
  return filter;
}

bool FilteredImage::applyFilterWithParams(const std::string& name, const std::string& params,
                                          const FilterConfig& config, Image<RGBA8Pixel>& output) {
  const std::shared_ptr<AbstractFilter> filter = setupFilter(name, params);
  if (filter == nullptr) return false;
  const Image<RGBA8Pixel>& source = *state_->image;
  const bool sameSize = output.width == source.width && output.height == source.height;
  // The copy fits itself to its output; every other filter writes the source's size.
  if (!sameSize && name != "PassThrough")
    throw std::invalid_argument("the output has another size than the photo");
  filter->applyConfig(params, config, output);
  return true;
}

}  // namespace pelorin::image_processing
