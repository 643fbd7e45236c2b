#include "image_processing/autoenhance/colour/lab_tables.h"

#include <bit>
#include <cstdint>

#include "image_processing/autoenhance/colour/lab_constants.h"

namespace pelorin::image_processing {
namespace {

/// Of a positive, finite number: steps of Halley's, each of which triples the right digits, from a third
/// of the exponent. Of every float from cieEpsilon to 1 it is, as a float, what std::cbrt gives, in
/// less than half of the time: a table of it is built whenever a process starts.
double cubeRoot(double x) {
  constexpr std::uint64_t exponentOffset = std::uint64_t{0x2A9F7893} << 32;
  double root = std::bit_cast<double>(std::bit_cast<std::uint64_t>(x) / 3 + exponentOffset);
  for (int step = 0; step < 3; ++step) {
    const double cube = root * root * root;
    root *= (cube + 2.0 * x) / (2.0 * cube + x);
  }
  return root;
}

}  // namespace

float XYZ2labTable::f(float x) const {
  if (x > cieEpsilon) return static_cast<float>(cubeRoot(x));
  return (labLOffset + cieKappa * x) / labLGain;
}

float Lab2xzTable::f(float x) const {
  const float cube = (x * x) * x;
  return cube > cieEpsilon ? cube : (labLGain * x - labLOffset) / cieKappa;
}

float Lab2yTable::f(float x) const {
  if (x > cieKappaEpsilon) {
    const float fy = (x + labLOffset) / labLGain;
    return (fy * fy) * fy;
  }
  return x / cieKappa;
}

}  // namespace pelorin::image_processing
