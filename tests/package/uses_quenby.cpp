#include <cstdio>
#include <memory>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"

using namespace pelorin::image_processing;

int main() {
  auto photo = std::make_shared<Image<RGBA8Pixel>>(64, 48);
  photo->set({90, 120, 60, 255});
  FilteredImage session(photo, ImageMetadata{}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> output(64, 48);
  const bool applied =
      session.applyFilterWithParams("AE0", "slider=0.4;", defaultFilterConfigValue, output);
  std::printf("applied: %d, alpha %d\n", applied, output.data.get()[0].a);
  return applied && output.data.get()[0].a == 255 ? 0 : 1;
}
