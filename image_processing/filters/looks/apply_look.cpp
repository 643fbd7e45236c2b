#include "image_processing/filters/looks/apply_look.h"

#include <algorithm>

#include "image_processing/filters/looks/look_rows.h"

namespace pelorin::image_processing {

void applyLook(const Look& look, const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output) {
  const LookRows rows(look, source.width, source.height);
  rows.apply(0, source.data.get(), output.data.get(),
             std::min(source.pixelCount(), output.pixelCount()));
}

}  // namespace pelorin::image_processing
