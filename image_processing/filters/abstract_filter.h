#pragma once

#include <memory>
#include <string>
#include <utility>

#include "image_processing/core/image.h"
#include "image_processing/filters/filter_config.h"
#include "image_processing/filters/filter_parameter.h"
#include "image_processing/filters/filtered_image_state.h"

namespace pelorin::image_processing {

/// A filter bound to one editing session: `init` once, then `applyConfig` as often as wanted.
class AbstractFilter {
 public:
  explicit AbstractFilter(std::shared_ptr<FilteredImageState> session)
      : state(std::move(session)) {}
  virtual ~AbstractFilter() = default;
  AbstractFilter(const AbstractFilter&) = delete;
  AbstractFilter& operator=(const AbstractFilter&) = delete;

  /// What the filter takes beside the photo. A class with keys of its own has a function of this
  /// name in place of this one, and its description in the registry finds that.
  static FilterParameters parameters() { return {}; }

  /// Prepares the filter from a parameter string ("key=value;" items). Called once, before the
  /// filter is shared between threads. May throw std::bad_alloc.
  virtual void init(const std::string& params) = 0;

  /// Writes the filtered source image into `output`, which has the size of the source.
  /// @throws std::bad_alloc, and what the filter's parameters ask for: std::out_of_range for a
  ///         missing one, boost::bad_lexical_cast for an unreadable one; `output` is then as it
  ///         was.
  virtual void applyConfig(const std::string& params, const FilterConfig& config,
                           Image<RGBA8Pixel>& output) = 0;

 protected:
  std::shared_ptr<FilteredImageState> state;
};

}  // namespace pelorin::image_processing
