// A tone curve of any numbers, pixels and masks: the pass over a row has the bytes of its definition.
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "fuzz/bytes.h"
#include "image_processing/autoenhance/colour/lab_constants.h"
#include "image_processing/autoenhance/enhance_row.h"

using namespace pelorin::image_processing;

namespace {

/// One number in four is any bits, others are ordinary ones.
float numberOf(Bytes& bytes, float most) {
  const auto kind = bytes.next();
  if (kind < 64) return bytes.next<float>();
  return most * static_cast<float>(bytes.next<std::uint16_t>()) / 65535.0f;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  Bytes bytes(data, size);
  std::vector<float> curve(2 + bytes.next() % 70);
  for (float& sample : curve) sample = numberOf(bytes, 1.0f);
  const bool otherScale = bytes.next() < 16;
  const float scale = otherScale ? 1.0f + bytes.next() : labWhite;
  const float vibrance = numberOf(bytes, 2.0f), blend = numberOf(bytes, 1.0f),
              gain = numberOf(bytes, 4.0f);
  const TonePass pass(curve, scale, vibrance, blend, gain);
  const bool masked = bytes.next() % 4 != 0;
  std::vector<RGBA8Pixel> pixels;
  std::vector<float> bilateral, ltm;
  while (!bytes.empty()) {
    pixels.push_back(bytes.next<RGBA8Pixel>());
    bilateral.push_back(numberOf(bytes, 1.0f));
    ltm.push_back(numberOf(bytes, 1.0f));
  }
  const float* const b = masked ? bilateral.data() : nullptr;
  const float* const l = masked ? ltm.data() : nullptr;
  std::vector<RGBA8Pixel> expected(pixels.size()), actual(pixels.size());
  enhanceRowScalar(pass, pixels.data(), b, l, expected.data(), pixels.size());
  enhanceRow(pass, pixels.data(), b, l, actual.data(), pixels.size());
  if (!pixels.empty() &&
      std::memcmp(expected.data(), actual.data(), pixels.size() * sizeof(RGBA8Pixel)) != 0)
    std::abort();
  return 0;
}
