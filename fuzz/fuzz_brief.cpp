// A picture and corners anywhere out of bytes: descriptors must be those of the definition, for the
// corners inside the margin and no others.
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "image_processing/features/brief.h"
#include "image_processing/features/brief_bits.h"

using namespace pelorin::image_processing;

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size < 4) return 0;
  const std::uint32_t width = 1 + data[0] % 80;
  const int threshold = data[1] - 5;
  const std::size_t count = data[2] % 8;
  data += 4;
  size -= 4;
  if (size < count * sizeof(xy)) return 0;
  std::vector<xy> corners(count);
  if (count > 0) std::memcpy(corners.data(), data, count * sizeof(xy));
  data += count * sizeof(xy);
  size -= count * sizeof(xy);

  const std::uint32_t height = static_cast<std::uint32_t>(size / width);
  const Image<unsigned char> image(width, height);
  std::memcpy(image.data.get(), data, image.byteSize());
  // Half of the corners at least near the picture.
  for (std::size_t i = 0; i < count; i += 2) {
    corners[i] = {corners[i].x % 100, height == 0 ? 0 : corners[i].y % static_cast<int>(height)};
  }

  std::vector<BriefDescriptor> expected, actual;
  for (const xy& c : corners) {
    const std::int64_t x = c.x, y = c.y;
    if (x <= 15 || y <= 15 || x >= std::int64_t{width} - 15 || y >= std::int64_t{height} - 15) {
      continue;
    }
    expected.push_back({c, briefBitsScalar(image.row(c.y) + c.x, width)});
  }
  brief(corners.data(), static_cast<int>(count), image, actual);
  if (actual != expected) std::abort();

  for (const BriefDescriptor& descriptor : computeBriefDescriptors(image, threshold)) {
    const auto [x, y] = descriptor.center;
    if (descriptor.descriptor != briefBitsScalar(image.row(y) + x, width)) std::abort();
  }
  return 0;
}
