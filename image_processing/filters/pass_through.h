#pragma once

#include "image_processing/filters/abstract_filter.h"

namespace pelorin::image_processing {

/// Copies the source as it is; bytes that only one of the two images has are left alone.
class PassThrough : public AbstractFilter {
 public:
  using AbstractFilter::AbstractFilter;

  void init(const std::string& params) override;
  void applyConfig(const std::string& params, const FilterConfig& config,
                   Image<RGBA8Pixel>& output) override;
};

}  // namespace pelorin::image_processing
