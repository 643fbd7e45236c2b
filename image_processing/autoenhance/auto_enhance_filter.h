#pragma once

#include <memory>
#include <string>

#include "image_processing/autoenhance/lightness/image_statistics.h"
#include "image_processing/autoenhance/masks/image_masks.h"
#include "image_processing/filters/abstract_filter.h"
#include "image_processing/filters/row_filter.h"

namespace pelorin::image_processing {

class FilterParams;

/// Access to the masks of an auto-enhance filter, for looking at them.
class AEFilterBase {
 public:
  virtual ~AEFilterBase() = default;

  /// A new image with the mask's values. @throws std::logic_error when no masks were computed.
  virtual std::shared_ptr<Image<float>> getBilateralMask() const = 0;
  virtual std::shared_ptr<Image<float>> getLtmMask() const = 0;
};

/// Automatic enhancement with masks of the given pixel types. `init` analyses the photo once;
/// applications then only read, so several may run at once on different outputs.
///
/// Parameters: "slider" (a float, required by `applyConfig`), "gtmOnly" (true: global tone curve
/// only, no masks; to be given to both calls or neither), "gtmExtraMemory" (true with gtmOnly: the
/// masks are allocated all the same, and never used).
template <typename TB, typename TL>
class AEFilterT : public AbstractFilter, public AEFilterBase {
 public:
  using AbstractFilter::AbstractFilter;

  static FilterParameters parameters();
  static std::unique_ptr<RowFilter> forRows(const RowRequest& request);

  /// Starts anew: what an earlier `init` prepared is gone. When it throws, there are no masks, but
  /// unless memory ran out for them too there are statistics, so that global applications work.
  void init(const std::string& params) override;
  void applyConfig(const std::string& params, const FilterConfig& config,
                   Image<RGBA8Pixel>& output) override;
  std::shared_ptr<Image<float>> getBilateralMask() const override;
  std::shared_ptr<Image<float>> getLtmMask() const override;

 private:
  void prepare(const FilterParams& options);

  ImageStatistics statistics_;
  ImageMasks<TB, TL> masks_;
};

/// "AE0": masks in float.
class AEFilter : public AEFilterT<float, float> {
 public:
  using AEFilterT::AEFilterT;
};

/// "AE08bit": masks in a quarter of the memory.
class AEFilter8bit
    : public AEFilterT<QuantizedFloat<unsigned char>, QuantizedFloat<unsigned char>> {
 public:
  using AEFilterT::AEFilterT;
};

}  // namespace pelorin::image_processing
