#pragma once

#include <memory>

#include "image_processing/filters/abstract_filter.h"
#include "image_processing/filters/row_filter.h"

namespace pelorin::image_processing {

/// Copies the source as it is; bytes that only one of the two images has are left alone.
class PassThrough : public AbstractFilter {
 public:
  using AbstractFilter::AbstractFilter;

  void init(const std::string& params) override;
  void applyConfig(const std::string& params, const FilterConfig& config,
                   Image<RGBA8Pixel>& output) override;

  static std::unique_ptr<RowFilter> forRows(const RowRequest& request);
};

}  // namespace pelorin::image_processing
