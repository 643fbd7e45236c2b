// Fingerprints of whole results: any change of one byte anywhere in the chain is seen here, on
// every platform the tests run on.
#include <gtest/gtest.h>

#include <string>

#include "image_processing/autoenhance/auto_enhance_filter.h"
#include "tests/support/faces.h"
#include "tests/support/filter_state.h"
#include "tests/support/fingerprint.h"
#include "tests/support/pictures.h"

namespace pelorin::image_processing {
namespace {

using test_support::fingerprint;
using test_support::photoLikePicture;
using test_support::stateOf;
using test_support::withFaces;

struct Golden {
  std::uint32_t width, height;
  bool faces, grid;
  const char* slider;
  const char* floatMasks;
  const char* byteMasks;
};

void PrintTo(const Golden& golden, std::ostream* stream) {
  *stream << golden.width << " x " << golden.height << (golden.faces ? ", faces" : "")
          << (golden.grid ? ", grid" : ", exact") << ", slider " << golden.slider;
}

template <typename Filter>
std::string result(const Golden& golden) {
  const auto w = static_cast<std::int32_t>(golden.width);
  const auto h = static_cast<std::int32_t>(golden.height);
  ImageMetadata metadata;
  if (golden.faces) metadata = withFaces({{w / 4, w / 2, h / 2, h / 5}, {w / 3, w, h + 9, h / 2}});
  FilterConfig config = defaultFilterConfigValue;
  config.useBilateralGrid = golden.grid ? 1 : 0;
  config.bilateralSpatialFraction = golden.grid ? 0.025f : 0.05f;
  const auto photo = photoLikePicture(golden.width, golden.height, golden.width);
  Filter filter(stateOf(photo, metadata, config));
  filter.init("");
  Image<RGBA8Pixel> output(golden.width, golden.height);
  filter.applyConfig(std::string("slider=") + golden.slider, defaultFilterConfigValue, output);
  const auto bilateral = filter.getBilateralMask(), ltm = filter.getLtmMask();
  return fingerprint(*bilateral).substr(0, 8) + fingerprint(*ltm).substr(0, 8) +
         fingerprint(output);
}

class GoldenResults : public testing::TestWithParam<Golden> {};

TEST_P(GoldenResults, StandToTheByte) {
  EXPECT_EQ(result<AEFilter>(GetParam()), GetParam().floatMasks);
  EXPECT_EQ(result<AEFilter8bit>(GetParam()), GetParam().byteMasks);
}

INSTANTIATE_TEST_SUITE_P(
    PhotoLike, GoldenResults,
    testing::Values(Golden{160, 120, false, true, "0", "713153bd207da3cb001326ed3695e946",
                           "1cc3194500c10da7001326ed3695e946"},
                    Golden{160, 120, false, true, "0.15", "713153bd207da3cb6a579ea75c4d8093",
                           "1cc3194500c10da74e1af8da67f30901"},
                    Golden{160, 120, false, true, "0.4", "713153bd207da3cb4b07c7c6a36f32b3",
                           "1cc3194500c10da739a8ee4928e53525"},
                    Golden{160, 120, false, true, "1", "713153bd207da3cbf639763ea08f6115",
                           "1cc3194500c10da74d8743e810176809"},
                    Golden{160, 120, true, true, "0.4", "713153bdff4922a9abbeb805d9ea186f",
                           "1cc31945b530ff60bedc63168d14ab80"},
                    Golden{160, 120, true, true, "0.8", "713153bdff4922a997e1bcaa6d224c01",
                           "1cc31945b530ff6009d42a532ac6512c"},
                    Golden{97, 131, true, false, "0.4", "c4d03c9924405ec0c1bc26f33100a29c",
                           "25485fe78c88da0d238b7476b74f9913"},
                    Golden{97, 131, false, false, "0.9", "c4d03c99c5a7946c4ba0ec03dfa1a36b",
                           "25485fe7a545ed0050cb0c389319246e"},
                    Golden{500, 333, false, true, "0.4", "9dc833a9ea97b75cb34d4481ff839f5c",
                           "488425c14d29f22cc2141ccf40143ec1"},
                    Golden{640, 480, true, true, "0.6", "fd07ab2f58b86d9a2bb246e21cf95d35",
                           "6693995008bf814c6001a75450f692f7"},
                    Golden{1, 1, true, true, "0.5", "297f4593f2037468bfdc13b17795c8f4",
                           "d2b134b926903b581316e8a11e83c960"},
                    Golden{801, 3, false, true, "0.5", "d476461055d2bae5facc0196457baf76",
                           "6a019224b715452aa0b16e66ef538710"},
                    Golden{2, 700, true, true, "-0.5", "bb86272b4556d82786f005a06b955e22",
                           "45a2f86484c79f00b822a580498c94a0"}));

}  // namespace
}  // namespace pelorin::image_processing
