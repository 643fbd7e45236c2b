#include <gtest/gtest.h>

#include <vector>

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "tests/autoenhance/colour/lab_simd_test.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

#include "image_processing/autoenhance/colour/colour_tables.h"
#include "image_processing/autoenhance/colour/lab_simd.h"
#include "tests/support/instruction_sets.h"
#include "tests/support/pictures.h"

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
namespace hn = hwy::HWY_NAMESPACE;

/// Looks up `count` places, a multiple of 16.
void labToXz(const float* places, float* values, std::size_t count) {
  for (std::size_t i = 0; i < count; i += hn::Lanes(lab::Floats())) {
    const auto place = hn::LoadU(lab::Floats(), places + i);
    hn::StoreU(lab::labToXz(place), lab::Floats(), values + i);
  }
}

void labToY(const float* places, float* values, std::size_t count) {
  for (std::size_t i = 0; i < count; i += hn::Lanes(lab::Floats())) {
    const auto place = hn::LoadU(lab::Floats(), places + i);
    hn::StoreU(lab::labToY(place), lab::Floats(), values + i);
  }
}

}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();

#if HWY_ONCE
namespace pelorin::image_processing {
namespace {
HWY_EXPORT(labToXz);
HWY_EXPORT(labToY);

/// Places in and beside a domain from 0 to `end`: within each of the thousand steps and close to
/// its ends.
std::vector<float> placesUpTo(float end) {
  std::vector<float> places = {-5.0f, -1e-9f, 0.0f, 1.001f * end, 3.0f * end, 1e6f};
  test_support::Random random(3);
  for (int i = 0; i < 1000; ++i) {
    for (const float fraction : {-1e-4f, 0.0f, 1e-4f, 0.5f, random.nextFloat()}) {
      places.push_back((static_cast<float>(i) + fraction) / 999.0f * end);
    }
  }
  places.resize((places.size() + 15) / 16 * 16);
  return places;
}

TEST(LabVectors, GiveTheSamplesOfTheTableFromLabToXz) {
  const std::vector<float> places = placesUpTo(1.0f);
  std::vector<float> values(places.size());
  test_support::onEveryInstructionSet([&] {
    HWY_DYNAMIC_DISPATCH(labToXz)(places.data(), values.data(), places.size());
    for (std::size_t i = 0; i < places.size(); ++i) {
      ASSERT_EQ(values[i], colourTables().labToXz(places[i])) << places[i];
    }
  });
}

TEST(LabVectors, GiveTheSamplesOfTheTableFromLToY) {
  const std::vector<float> places = placesUpTo(100.0f);
  std::vector<float> values(places.size());
  test_support::onEveryInstructionSet([&] {
    HWY_DYNAMIC_DISPATCH(labToY)(places.data(), values.data(), places.size());
    for (std::size_t i = 0; i < places.size(); ++i) {
      ASSERT_EQ(values[i], colourTables().labToY(places[i])) << places[i];
    }
  });
}

}  // namespace
}  // namespace pelorin::image_processing
#endif
