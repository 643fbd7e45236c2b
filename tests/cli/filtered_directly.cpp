#include "tests/cli/filtered_directly.h"

#include <gtest/gtest.h>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"

namespace pelorin::test_support {

using namespace image_processing;

Bytes filteredDirectly(const Image<RGBA8Pixel>& source, const std::string& filter,
                       const std::string& params, const ImageMetadata& faces) {
  auto image = std::make_shared<Image<RGBA8Pixel>>(source);
  Image<RGBA8Pixel> result(source.width, source.height);
  FilteredImage session(image, faces, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  EXPECT_TRUE(session.applyFilterWithParams(filter, params, defaultFilterConfigValue, result));
  return rawBytes(result);
}

}  // namespace pelorin::test_support
