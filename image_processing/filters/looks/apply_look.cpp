#include "image_processing/filters/looks/apply_look.h"

#include <algorithm>

#include "image_processing/filters/looks/look_rows.h"

namespace pelorin::image_processing {

void applyLook(const Look& look, const Image<RGBA8Pixel>& source, Image<RGBA8Pixel>& output,
               Workers* workers) {
  const LookRows rows(look, source.width, source.height);
  const std::size_t pixels = std::min(source.pixelCount(), output.pixelCount());
  const std::size_t parts = tasksFor(workers);
  runTasks(workers, parts, [&](std::size_t part) {
    const auto y = static_cast<std::uint32_t>(partStart(source.height, part, parts));
    const auto endY = static_cast<std::uint32_t>(partStart(source.height, part + 1, parts));
    const std::size_t first = std::min(std::size_t{y} * source.width, pixels);
    const std::size_t end = std::min(std::size_t{endY} * source.width, pixels);
    rows.apply(y, source.data.get() + first, output.data.get() + first, end - first);
  });
}

}  // namespace pelorin::image_processing
