#pragma once

#include <map>
#include <memory>
#include <mutex>
#include <string>

#include "image_processing/core/workers.h"
#include "image_processing/filters/abstract_filter.h"
#include "image_processing/filters/filter_factory.h"

namespace pelorin::image_processing {

/// An editing session on one source image, with a cache of the filters used so far. Several threads
/// may apply filters at once, each into an output of its own.
class FilteredImage {
 public:
  /// Shares `image` and keeps copies of the rest. `factory` decides which names exist.
  /// @param workers  share the work of the filters and outlive them; null for none.
  FilteredImage(std::shared_ptr<Image<RGBA8Pixel>>& image, const ImageMetadata& metadata,
                const std::string& sessionName, const FilterConfig& config,
                std::shared_ptr<FilterFactory> factory, Workers* workers = nullptr);

  /// Lends the session other workers, before any other call uses it.
  void share(Workers* workers) { state_->workers = workers; }

  /// The session's filter of that name, made and initialised with `params` on the first request:
  /// later ones get the same filter and their `params` are ignored. Empty when the name is unknown.
  /// The filter shares the session's state and may outlive the session.
  /// @throws what the filter's `init` throws; the next request then tries again.
  std::shared_ptr<AbstractFilter> setupFilter(const std::string& name, const std::string& params);

  /// Applies a filter by name into `output`, which has the size of the source. It may be the source
  /// itself, when the photo as it was is needed no more: filters write no pixel before they have
  /// read it, but the session's masks and statistics stay those of the photo as it was.
  /// @returns false, with nothing written, when the name is unknown.
  /// @throws std::invalid_argument, with nothing written, for an output of another size, except that
  ///         PassThrough copies as many bytes as both have; and what `init` and `applyConfig` of the
  ///         filter throw.
  bool applyFilterWithParams(const std::string& name, const std::string& params,
                             const FilterConfig& config, Image<RGBA8Pixel>& output);

 private:
  std::shared_ptr<FilteredImageState> state_;
  std::map<std::string, std::shared_ptr<AbstractFilter>> filters_;
  std::shared_ptr<FilterFactory> factory_;
  std::mutex mutex_;  // guards filters_; never held while a filter works
};

}  // namespace pelorin::image_processing
