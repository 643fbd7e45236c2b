#include "image_processing/filters/default_filter_factory.h"

#include <mutex>

#include "image_processing/autoenhance/auto_enhance_filter.h"
#include "image_processing/core/never_destroyed.h"
#include "image_processing/filters/looks/low_dim_rgb_curve_filter.h"
#include "image_processing/filters/looks/preset_looks.h"
#include "image_processing/filters/pass_through.h"

namespace pelorin::image_processing {

// Nothing here is ever destroyed: threads may still filter while the process ends.

DefaultFilterFactory::DefaultFilterFactory() {
  static NeverDestroyed<ConcreteDescription<AEFilter8bit>> ae8bit("AE08bit", "Auto",
                                                                  "Auto-enhance with 8-bit masks.");
  static NeverDestroyed<ConcreteDescription<AEFilter>> ae(
      "AE0", "Auto", "Original auto-enhance. Parameters: \"slider=0.4;\" sets slider to 0.4");
  static NeverDestroyed<ConcreteDescription<ZebraBWFilter>> zebraBW(
      "ZebraBW", "Snow", "Black-and-white filter with softlight radial vignette.");
  static NeverDestroyed<ConcreteDescription<SummerRGBFilter>> summerRGB(
      "SummerRGB", "Summer", "A light filter with hints of raspberry.");
  static NeverDestroyed<ConcreteDescription<SpringRGBFilter>> springRGB(
      "SpringRGB", "Spring", "Warm filter with radial vignette.");
  static NeverDestroyed<ConcreteDescription<FallRGBFilter>> fallRGB(
      "FallRGB", "Fall", "A bright and energetic filter.");
  static NeverDestroyed<ConcreteDescription<VintageRGBFilter>> vintageRGB(
      "VintageRGB", "Vintage", "Filter that gives a 'vintage' effect.");
  static NeverDestroyed<ConcreteDescription<WinterRGBFilter>> winterRGB(
      "WinterRGB", "Winter", "Cool filter with softlight radial vignette.");
  static NeverDestroyed<ConcreteDescription<LowDimRGBCurveFilter>> lowDimRGBCurve(
      "LowDimRGBCurve", "StarFish",
      "RGB Curve filter with four parameters, s1, s2, s3, and s4. Each should be in range [0,1]. "
      "Set all to 0.5 for the filter that makes minimal changes.");
  static NeverDestroyed<ConcreteDescription<PassThrough>> passThrough(
      "PassThrough", "Original", "Pass through filter, no changes are made to the image");

  for (FilterDescription* description : std::initializer_list<FilterDescription*>{
           &*ae8bit, &*ae, &*zebraBW, &*summerRGB, &*springRGB, &*fallRGB, &*vintageRGB,
           &*winterRGB, &*lowDimRGBCurve, &*passThrough}) {
    addFilterDescription(description);
  }
}

std::shared_ptr<FilterFactory> DefaultFilterFactory::filterFactory() {
  static NeverDestroyed<std::shared_ptr<FilterFactory>> ptr;
  static std::mutex instanceLock;
  const std::lock_guard lock(instanceLock);
  if (*ptr == nullptr) *ptr = std::make_shared<DefaultFilterFactory>();
  return *ptr;
}

}  // namespace pelorin::image_processing
