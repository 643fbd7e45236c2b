#include "cli/frame/look_name.h"

#include <gmock/gmock.h>

#include "cli/frame/errors.h"

namespace pelorin::cli {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

TEST(LookName, IsARegistryNameOrADisplayNameInAnyCase) {
  for (const char* name : {"ZebraBW", "zebrabw", "ZEBRABW", "Snow", "snow", "sNOW"}) {
    EXPECT_EQ(lookNamed(name).name, "ZebraBW") << name;
  }
  EXPECT_EQ(lookNamed("starfish").name, "LowDimRGBCurve");
  EXPECT_EQ(lookNamed("original").name, "PassThrough");
  EXPECT_EQ(lookNamed("ae08BIT").name, "AE08bit");
}

TEST(LookName, OfTwoFiltersIsTheFirst) {
  EXPECT_EQ(lookNamed("Auto").name, "AE0");
  EXPECT_THAT(othersShownAs(lookNamed("Auto")), ElementsAre("AE08bit"));
  EXPECT_THAT(othersShownAs(lookNamed("AE08bit")), ElementsAre("AE0"));
  EXPECT_THAT(othersShownAs(lookNamed("Winter")), IsEmpty());
}

TEST(LookName, ThatIsUnknownLeadsToTheNearest) {
  const auto refusal = [](const std::string& name) -> std::string {
    try {
      return "accepted as " + lookNamed(name).name;
    } catch (const UsageError& error) {
      return error.what();
    }
  };
  EXPECT_EQ(refusal("wintr"), "unknown look 'wintr'; did you mean 'Winter'?");
  EXPECT_EQ(refusal("vintagergbs"), "unknown look 'vintagergbs'; did you mean 'VintageRGB'?");
  EXPECT_EQ(refusal("Snow "), "unknown look 'Snow '; did you mean 'Snow'?");
  EXPECT_THAT(refusal(""), testing::StartsWith("unknown look ''"));
}

}  // namespace
}  // namespace pelorin::cli
