#pragma once

#include <memory>

#include "image_processing/filters/filter_factory.h"

namespace pelorin::image_processing {

/// The registry of the built-in filters.
class DefaultFilterFactory : public FilterFactory {
 public:
  DefaultFilterFactory();

  /// The one registry of the process, made at the first call. Any thread may call.
  static std::shared_ptr<FilterFactory> filterFactory();
};

}  // namespace pelorin::image_processing
