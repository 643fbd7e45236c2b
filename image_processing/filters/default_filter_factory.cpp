#include "image_processing/filters/default_filter_factory.h"

#include <mutex>

#include "image_processing/autoenhance/auto_enhance_filter.h"
#include "image_processing/filters/pass_through.h"

namespace pelorin::image_processing {

DefaultFilterFactory::DefaultFilterFactory() {
  static ConcreteDescription<AEFilter8bit> ae8bit("AE08bit", "Auto",
                                                  "Auto-enhance with 8-bit masks.");
  static ConcreteDescription<AEFilter> ae(
      "AE0", "Auto", "Original auto-enhance. Parameters: \"slider=0.4;\" sets slider to 0.4");
  static ConcreteDescription<PassThrough> passThrough(
      "PassThrough", "Original", "Pass through filter, no changes are made to the image");

  for (FilterDescription* description :
       std::initializer_list<FilterDescription*>{&ae8bit, &ae, &passThrough}) {
    addFilterDescription(description);
  }
}

std::shared_ptr<FilterFactory> DefaultFilterFactory::filterFactory() {
  static std::shared_ptr<FilterFactory> ptr;
  static std::mutex instanceLock;
  const std::lock_guard lock(instanceLock);
  if (ptr == nullptr) ptr = std::make_shared<DefaultFilterFactory>();
  return ptr;
}

}  // namespace pelorin::image_processing
