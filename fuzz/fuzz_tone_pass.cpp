// A tone curve of any numbers, pixels and masks: the pass over a row has the bytes of its definition.
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "image_processing/autoenhance/colour/lab_constants.h"
#include "image_processing/autoenhance/enhance_row.h"

using namespace pelorin::image_processing;

namespace {

/// The bytes, noughts when there are no more.
class Bytes {
 public:
  Bytes(const std::uint8_t* data, std::size_t size) : data_(data), left_(size) {}
  bool empty() const { return left_ == 0; }

  template <typename T>
  T next() {
    T value{};
    const std::size_t count = std::min(left_, sizeof(T));
    std::memcpy(&value, data_, count);
    data_ += count;
    left_ -= count;
    return value;
  }

  /// One number in four is any bits, others are ordinary ones.
  float number(float most) {
    const auto kind = next<std::uint8_t>();
    if (kind < 64) return next<float>();
    return most * static_cast<float>(next<std::uint16_t>()) / 65535.0f;
  }

 private:
  const std::uint8_t* data_;
  std::size_t left_;
};

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  Bytes bytes(data, size);
  std::vector<float> curve(2 + bytes.next<std::uint8_t>() % 70);
  for (float& sample : curve) sample = bytes.number(1.0f);
  const bool otherScale = bytes.next<std::uint8_t>() < 16;
  const float scale = otherScale ? 1.0f + bytes.next<std::uint8_t>() : labWhite;
  const float vibrance = bytes.number(2.0f), blend = bytes.number(1.0f), gain = bytes.number(4.0f);
  const TonePass pass(curve, scale, vibrance, blend, gain);
  const bool masked = bytes.next<std::uint8_t>() % 4 != 0;
  std::vector<RGBA8Pixel> pixels;
  std::vector<float> bilateral, ltm;
  while (!bytes.empty()) {
    pixels.push_back(bytes.next<RGBA8Pixel>());
    bilateral.push_back(bytes.number(1.0f));
    ltm.push_back(bytes.number(1.0f));
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
