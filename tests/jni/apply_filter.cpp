#include <cstdio>
#include <cstdlib>
#include <memory>

#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"

// The engine without Java, for the tests of the Java classes to compare with:
//   apply_filter WIDTH HEIGHT FILTER PARAMETERS < rgba > rgba
// Filters a photo without faces; an unknown filter is exit code 1. Without arguments it lists the
// filters, a line each: key, name to show, keys of parameters.
int main(int count, char** arguments) {
  using namespace pelorin::image_processing;
  if (count == 1) {
    for (const auto& [key, filter] : DefaultFilterFactory::filterFactory()->descriptions) {
      std::printf("%s %s", key.c_str(), filter->displayName.c_str());
      for (const FilterParameter& row : filter->parameters().rows)
        std::printf(" %s", row.name.c_str());
      std::puts("");
    }
    return 0;
  }
  if (count != 5) return 2;
  const auto width = static_cast<std::uint32_t>(std::atoi(arguments[1]));
  const auto height = static_cast<std::uint32_t>(std::atoi(arguments[2]));
  auto photo = makeSharedImage<RGBA8Pixel>(width, height);
  if (std::fread(photo->data.get(), 4, photo->pixelCount(), stdin) != photo->pixelCount()) return 2;
  Image<RGBA8Pixel> output(width, height);
  FilteredImage session(photo, ImageMetadata{}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  if (!session.applyFilterWithParams(arguments[3], arguments[4], defaultFilterConfigValue, output))
    return 1;
  return std::fwrite(output.data.get(), 4, output.pixelCount(), stdout) == output.pixelCount() ? 0
                                                                                               : 2;
}
