#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "image_processing/dupe/dupe_score.h"
#include "jni/load_time_cache.h"
#include "tests/jni/support/natives_fixture.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using image_processing::dupeStatisticTimeOrientationExposureInvariantKS;
using testing::ElementsAre;

class DupeNative : public NativesTest {
 protected:
  ~DupeNative() override {
    EXPECT_EQ(bitmap1.locks, 0);
    EXPECT_EQ(bitmap2.locks, 0);
  }

  const Image<RGBA8Pixel> picture1 = photoLikePicture(40, 30, 3);
  const Image<RGBA8Pixel> picture2 = photoLikePicture(30, 20, 4);
  FakeBitmap bitmap1{picture1}, bitmap2{picture2};
};

TEST_F(DupeNative, GivesTheEnginesScore) {
  EXPECT_EQ(natives.similarity(bitmap1.reference(), 100, 1, bitmap2.reference(), 97.5, 6),
            dupeStatisticTimeOrientationExposureInvariantKS(picture1, picture2, 2.5f, false));
  EXPECT_EQ(natives.similarity(bitmap1.reference(), 97.5, 3, bitmap2.reference(), 100, 3),
            dupeStatisticTimeOrientationExposureInvariantKS(picture1, picture2, 2.5f, true));
}

TEST_F(DupeNative, ScoresAPhotoAgainstItself) {
  EXPECT_NEAR(natives.similarity(bitmap1.reference(), 5, 1, bitmap1.reference(), 5, 1), 3.6619,
              0.05);
}

TEST_F(DupeNative, TakesTheDifferenceOfTimesInDouble) {
  const double now = 1.7e9;  // whose neighbours in float are 128 apart
  EXPECT_EQ(natives.similarity(bitmap1.reference(), now + 0.25, 1, bitmap2.reference(), now, 1),
            dupeStatisticTimeOrientationExposureInvariantKS(picture1, picture2, 0.25f, true));
}

TEST_F(DupeNative, ReadsPaddedRows) {
  FakeBitmap padded1(picture1, 8), padded2(picture2, 4);
  EXPECT_EQ(natives.similarity(padded1.reference(), 0, 1, padded2.reference(), 1, 1),
            natives.similarity(bitmap1.reference(), 0, 1, bitmap2.reference(), 1, 1));
  EXPECT_EQ(padded1.locks + padded2.locks, 0);
}

TEST_F(DupeNative, ScoresTheBitmapsAsTheyAreOnceLocked) {
  FakeBitmap first(picture1), second(picture2);
  first.info.height = second.info.height = 5;
  const float expected = natives.similarity(first.reference(), 0, 1, second.reference(), 1, 1);
  bitmap1.heightOnceLocked = bitmap2.heightOnceLocked = 5;
  EXPECT_NE(natives.similarity(FakeBitmap(picture1).reference(), 0, 1,
                               FakeBitmap(picture2).reference(), 1, 1),
            expected);
  EXPECT_EQ(natives.similarity(bitmap1.reference(), 0, 1, bitmap2.reference(), 1, 1), expected);
}

TEST_F(DupeNative, GivesTheErrorValueForABitmapThatCannotBeRead) {
  for (FakeBitmap* const broken : {&bitmap1, &bitmap2}) {
    const auto score = [&] {
      return natives.similarity(bitmap1.reference(), 0, 0, bitmap2.reference(), 0, 0);
    };
    broken->infoResult = -1;
    EXPECT_EQ(score(), -2222.0f);
    EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: AndroidBitmap_getInfo failed: -1"));
    broken->infoResult = 0;
    broken->lockResult = -3;
    EXPECT_EQ(score(), -2222.0f);
    EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: AndroidBitmap_lockPixels failed"));
    broken->lockResult = 0;
    broken->info.format = ANDROID_BITMAP_FORMAT_A_8;
    EXPECT_EQ(score(), -2222.0f);
    EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: bitmap format 8 is not RGBA_8888"));
    broken->info.format = ANDROID_BITMAP_FORMAT_RGBA_8888;
  }
  EXPECT_EQ(natives.similarity(nullptr, 0, 0, bitmap2.reference(), 0, 0), -2222.0f);
  EXPECT_EQ(natives.similarity(bitmap1.reference(), 0, 0, nullptr, 0, 0), -2222.0f);
}

TEST_F(DupeNative, GivesTheErrorValueThatJavaSays) {
  quenby::loadTimeCache.similarityError = -1.5f;
  EXPECT_EQ(natives.similarity(nullptr, 0, 0, bitmap2.reference(), 0, 0), -1.5f);
  quenby::loadTimeCache.similarityError = -2222.0f;
}

TEST_F(DupeNative, TakesTimesOfAnyKind) {
  const double infinity = std::numeric_limits<double>::infinity();
  const auto score = [&](double time1, double time2) {
    return natives.similarity(bitmap1.reference(), time1, 0, bitmap2.reference(), time2, 0);
  };
  EXPECT_TRUE(std::isnan(score(std::nan(""), 0)));
  EXPECT_TRUE(std::isnan(score(infinity, infinity)));
  EXPECT_EQ(score(infinity, 0), -infinity);
  EXPECT_EQ(score(1.7e308, -1.7e308), -infinity);
  EXPECT_EQ(score(1e300, 0), -infinity);
}

TEST_F(DupeNative, WorksOnBitmapsWithoutPixels) {
  FakeBitmap nothing(0, 0);
  natives.similarity(nothing.reference(), 0, 0, nothing.reference(), 0, 0);
  natives.similarity(bitmap1.reference(), 0, 0, nothing.reference(), 0, 0);
}

}  // namespace
}  // namespace pelorin::test_support
