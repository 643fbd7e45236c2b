#include "image_processing/filters/pass_through.h"

#include <algorithm>
#include <cstring>

namespace pelorin::image_processing {

void PassThrough::init(const std::string&) {}

void PassThrough::applyConfig(const std::string&, const FilterConfig&, Image<RGBA8Pixel>& output) {
  const Image<RGBA8Pixel>& source = *state->image;
  if (output.data == source.data) return;
  std::memcpy(output.data.get(), source.data.get(), std::min(source.byteSize(), output.byteSize()));
}

}  // namespace pelorin::image_processing
