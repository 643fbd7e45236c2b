#include <gtest/gtest.h>

#include <new>
#include <stdexcept>
#include <string>

#include "image_processing/autoenhance/auto_enhance_filter.h"
#include "tests/support/allocation_faults.h"
#include "tests/support/faces.h"
#include "tests/support/filter_state.h"
#include "tests/support/fingerprint.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::AllocationFaults;
using test_support::fingerprint;
using test_support::photoLikePicture;
using test_support::stateOf;
using test_support::withFaces;

template <typename Filter>
class FailedInit : public testing::Test {
 protected:
  static std::string globallyEnhanced(Filter& filter) {
    Image<RGBA8Pixel> output(60, 45);
    filter.applyConfig("slider=0.5;gtmOnly=true;", defaultFilterConfigValue, output);
    return fingerprint(output);
  }
};
using BothFilters = testing::Types<AEFilter, AEFilter8bit>;
TYPED_TEST_SUITE(FailedInit, BothFilters);

TYPED_TEST(FailedInit, LeavesTheStatisticsWhicheverAllocationFails) {
  FilterConfig exactly = defaultFilterConfigValue;
  exactly.useBilateralGrid = 0;
  exactly.bilateralSpatialFraction = 0.05f;
  const auto photo = photoLikePicture(60, 45, 1);
  const ImageMetadata faces = withFaces({{10, 40, 30, 5}});
  for (const FilterConfig& config : {defaultFilterConfigValue, exactly}) {
    for (const std::string params : {"", "gtmOnly=true;gtmExtraMemory=true;"}) {
      TypeParam whole(stateOf(photo, faces, config));
      whole.init(params);
      const std::string expected = this->globallyEnhanced(whole);
      bool failed = true;
      long failing = 0;
      while (failed) {
        TypeParam filter(stateOf(photo, faces, config));
        failed = false;
        try {
          const AllocationFaults faults(++failing);
          filter.init(params);
        } catch (const std::bad_alloc&) {
          failed = true;
        }
        ASSERT_EQ(this->globallyEnhanced(filter), expected) << "allocation " << failing;
        if (failed) {
          ASSERT_THROW(filter.getLtmMask(), std::logic_error) << "allocation " << failing;
        }
      }
      EXPECT_GT(failing, 10) << "allocations";
    }
  }
}

}  // namespace
}  // namespace pelorin::image_processing
