// The quality score: a picture of any size from the input's bytes, vectors against definition.
#include <cmath>
#include <cstdlib>
#include <cstring>

#include "image_processing/quality/niqe.h"
#include "image_processing/quality/niqe_features.h"

using namespace pelorin::image_processing;

// Four bytes of sizes and a mode, then pixels, repeated as often as needed.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  if (size < 6) return 0;
  // About a block; now and then two of them side by side.
  const std::uint32_t width = 94 + data[0] % 16 + (data[1] % 8 == 0 ? 96u : 0u);
  const std::uint32_t height = 94 + data[2] % 16;
  const std::uint8_t mask = data[3];  // few bits make flat areas
  data += 4;
  size -= 4;
  Image<RGBA8Pixel> picture(width, height);
  std::uint8_t* bytes = &picture.data.get()->r;
  for (std::size_t i = 0; i < picture.byteSize(); ++i)
    bytes[i] = data[(i + i / size / 3) % size] & mask;

  const float score = niqeMetric(picture);
  if (!isScorable(picture)) {
    if (!std::isnan(score)) std::abort();
    return 0;
  }
  const Image<float> expected = niqeFeaturesScalar(picture), actual = niqeFeatures(picture);
  if (expected.byteSize() != actual.byteSize() ||
      std::memcmp(expected.data.get(), actual.data.get(), actual.byteSize()) != 0)
    std::abort();
  return 0;
}
