#include "image_processing/filters/default_filter_factory.h"

#include <mutex>

#include "image_processing/autoenhance/auto_enhance_filter.h"
#include "image_processing/filters/looks/low_dim_rgb_curve_filter.h"
#include "image_processing/filters/looks/preset_looks.h"
#include "image_processing/filters/pass_through.h"

namespace pelorin::image_processing {

// Nothing here is ever destroyed: threads may still filter while the process ends.

DefaultFilterFactory::DefaultFilterFactory() {
  static auto& ae8bit =
      *new ConcreteDescription<AEFilter8bit>("AE08bit", "Auto", "Auto-enhance with 8-bit masks.");
  static auto& ae = *new ConcreteDescription<AEFilter>(
      "AE0", "Auto", "Original auto-enhance. Parameters: \"slider=0.4;\" sets slider to 0.4");
  static auto& zebraBW = *new ConcreteDescription<ZebraBWFilter>(
      "ZebraBW", "Snow", "Black-and-white filter with softlight radial vignette.");
  static auto& summerRGB = *new ConcreteDescription<SummerRGBFilter>(
      "SummerRGB", "Summer", "A light filter with hints of raspberry.");
  static auto& springRGB = *new ConcreteDescription<SpringRGBFilter>(
      "SpringRGB", "Spring", "Warm filter with radial vignette.");
  static auto& fallRGB =
      *new ConcreteDescription<FallRGBFilter>("FallRGB", "Fall", "A bright and energetic filter.");
  static auto& vintageRGB = *new ConcreteDescription<VintageRGBFilter>(
      "VintageRGB", "Vintage", "Filter that gives a 'vintage' effect.");
  static auto& winterRGB = *new ConcreteDescription<WinterRGBFilter>(
      "WinterRGB", "Winter", "Cool filter with softlight radial vignette.");
  static auto& lowDimRGBCurve = *new ConcreteDescription<LowDimRGBCurveFilter>(
      "LowDimRGBCurve", "StarFish",
      "RGB Curve filter with four parameters, s1, s2, s3, and s4. Each should be in range [0,1]. "
      "Set all to 0.5 for the filter that makes minimal changes.");
  static auto& passThrough = *new ConcreteDescription<PassThrough>(
      "PassThrough", "Original", "Pass through filter, no changes are made to the image");

  for (FilterDescription* description : std::initializer_list<FilterDescription*>{
           &ae8bit, &ae, &zebraBW, &summerRGB, &springRGB, &fallRGB, &vintageRGB, &winterRGB,
           &lowDimRGBCurve, &passThrough}) {
    addFilterDescription(description);
  }
}

std::shared_ptr<FilterFactory> DefaultFilterFactory::filterFactory() {
  static auto& ptr = *new std::shared_ptr<FilterFactory>;
  static std::mutex instanceLock;
  const std::lock_guard lock(instanceLock);
  if (ptr == nullptr) ptr = std::make_shared<DefaultFilterFactory>();
  return ptr;
}

}  // namespace pelorin::image_processing
