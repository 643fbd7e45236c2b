#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <limits>

#include "jni/session_table.h"
#include "tests/jni/support/natives_fixture.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

class EnhancementNatives : public NativesTest {
 protected:
  ~EnhancementNatives() override { EXPECT_EQ(quenby::openSessions().size(), 0u); }

  /// A session without faces.
  jlong open(FakeBitmap& photo) {
    const jlong handle = natives.init(photo.reference());
    natives.preprocess(noFaces, handle);
    takeLogLines();
    return handle;
  }

  FakeFaces noFaces{};
  FakeString passThrough{"PassThrough"}, ae{"AE0"}, slider{"slider=0.4;"}, empty{""};
  const Image<RGBA8Pixel> picture = photoLikePicture(64, 48, 1);
  FakeBitmap photo{picture};
  FakeBitmap output{64, 48};
};

TEST_F(EnhancementNatives, OpenASessionWithOneLine) {
  const jlong handle = natives.init(photo.reference());
  EXPECT_NE(handle, 0);
  EXPECT_THAT(takeLogLines(), ElementsAre("3 QuenbyLib: == QBE: init [64, 48]"));
  EXPECT_EQ(photo.locks, 0);
  natives.release(handle);
}

TEST_F(EnhancementNatives, OpenNoSessionOnABitmapThatCannotBeQueried) {
  photo.infoResult = -3;
  EXPECT_EQ(natives.init(photo.reference()), 0);
  EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: AndroidBitmap_getInfo failed: -3"));
  EXPECT_EQ(natives.init(nullptr), 0);
  EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: AndroidBitmap_getInfo failed: -1"));
}

TEST_F(EnhancementNatives, OpenNoSessionOnABitmapThatCannotBeLocked) {
  photo.lockResult = -1;
  EXPECT_EQ(natives.init(photo.reference()), 0);
  EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: AndroidBitmap_lockPixels failed"));
}

TEST_F(EnhancementNatives, OpenASessionOnTheBitmapAsItIsOnceLocked) {
  photo.heightOnceLocked = 20;
  const jlong handle = natives.init(photo.reference());
  EXPECT_THAT(takeLogLines(), ElementsAre("3 QuenbyLib: == QBE: init [64, 20]"));
  natives.release(handle);
}

TEST_F(EnhancementNatives, OpenNoSessionOnAnotherFormat) {
  for (const int format :
       std::initializer_list<int>{ANDROID_BITMAP_FORMAT_NONE, ANDROID_BITMAP_FORMAT_RGB_565,
                                  ANDROID_BITMAP_FORMAT_RGBA_4444, ANDROID_BITMAP_FORMAT_A_8, -1}) {
    photo.info.format = format;
    EXPECT_EQ(natives.init(photo.reference()), 0);
    EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: bitmap format " + std::to_string(format) +
                                            " is not RGBA_8888"));
  }
}

TEST_F(EnhancementNatives, OpenNoSessionOnRowsShorterThanTheirPixels) {
  photo.info.stride = 64 * 4 - 1;
  EXPECT_EQ(natives.init(photo.reference()), 0);
  EXPECT_THAT(takeLogLines(),
              ElementsAre("6 QuenbyLib: bitmap stride 255 is too small for width 64"));
}

TEST_F(EnhancementNatives, RaiseOutOfMemoryForABitmapBeyondTheAddressSpace) {
  photo.info = {0x3FFFFFFF, 0xFFFFFFFF, 0xFFFFFFFC, ANDROID_BITMAP_FORMAT_RGBA_8888, 0};
  EXPECT_EQ(natives.init(photo.reference()), 0);
  EXPECT_EQ(env.takeException(), "java/lang/OutOfMemoryError: QuenbyLib init ran out of memory");
  EXPECT_EQ(photo.locks, 0);
}

TEST_F(EnhancementNatives, CopyThePhotoSoThatTheBitmapMayChange) {
  const jlong handle = open(photo);
  std::fill(photo.bytes.begin(), photo.bytes.end(), 0);
  natives.apply(handle, output.reference(), passThrough, empty);
  EXPECT_EQ(output.packed(), bytesOf(picture));
  natives.release(handle);
}

TEST_F(EnhancementNatives, ReadAndWritePaddedRows) {
  FakeBitmap padded(picture, 12), paddedOutput(64, 48, 20);
  const jlong handle = open(padded);
  natives.apply(handle, paddedOutput.reference(), passThrough, empty);
  EXPECT_EQ(paddedOutput.packed(), bytesOf(picture));
  for (std::size_t y = 0; y < 48; ++y)
    for (std::size_t i = 0; i < 20; ++i)
      ASSERT_EQ(paddedOutput.bytes[y * paddedOutput.info.stride + 64 * 4 + i], 0xEE) << y;
  natives.release(handle);
}

TEST_F(EnhancementNatives, GiveTheEnginesBytesForEveryFilter) {
  const jlong handle = open(photo);
  for (const std::string& name : filterNames()) {
    FakeString filter(name), params("slider=0.7;s1=0.4;s2=0.6;s3=0.5;s4=0.55;maskAlpha=0.5;");
    natives.apply(handle, output.reference(), filter, params);
    EXPECT_EQ(output.packed(), engineResult(picture, name, params.text)) << name;
  }
  natives.release(handle);
}

TEST_F(EnhancementNatives, ReuseTheOutputOfTheLastCallWhateverIsInIt) {
  const jlong handle = open(photo);
  const auto session = quenby::openSessions().find(handle);
  std::vector<std::string> names = filterNames();
  names.push_back("NoSuchFilter");
  for (const std::string& name : names) {
    Image<RGBA8Pixel> spare(64, 48);
    const RGBA8Pixel* const address = spare.data.get();
    spare.set({0xAB, 0xAB, 0xAB, 0xAB});
    session->giveOutputBack(std::move(spare));
    FakeString filter(name), params("slider=0.7;s1=0.4;s2=0.6;s3=0.5;s4=0.55;");
    natives.apply(handle, output.reference(), filter, params);
    EXPECT_EQ(output.packed(),
              name == "NoSuchFilter" ? bytesOf(picture) : engineResult(picture, name, params.text));
    const Image<RGBA8Pixel> used = session->takeOutput();
    EXPECT_EQ(used.data.get(), address) << name;
    EXPECT_EQ(bytesOf(used), output.packed()) << name;
    EXPECT_NE(session->takeOutput().data.get(), address) << "two callers share an output";
  }
  natives.release(handle);
}

TEST_F(EnhancementNatives, LogFaceBoxesInPixels) {
  FakeBitmap large(400, 300);
  const jlong handle = natives.init(large.reference());
  takeLogLines();
  FakeFaces faces{{0.25f, 0.1f, 0.75f, 0.6f}};
  natives.preprocess(faces, handle);
  EXPECT_THAT(takeLogLines(), ElementsAre("3 QuenbyLib: face bb: [100 300 180 30]"));
  natives.release(handle);
}

TEST_F(EnhancementNatives, SkipNullFacesWithoutALine) {
  const jlong handle = open(photo);
  FakeFaces faces{{0, 0, 0.5f, 0.5f}};
  faces.elements.insert(faces.elements.begin(), nullptr);
  faces.addNull();
  natives.preprocess(faces, handle);
  EXPECT_THAT(takeLogLines(), ElementsAre("3 QuenbyLib: face bb: [0 32 24 0]"));
  natives.preprocess(noFaces, handle);
  EXPECT_THAT(takeLogLines(), IsEmpty());
  natives.release(handle);
}

TEST_F(EnhancementNatives, TakeANullArrayForNoFaces) {
  const jlong handle = natives.init(photo.reference());
  natives.preprocess(nullptr, handle);
  natives.apply(handle, output.reference(), ae, slider);
  EXPECT_EQ(output.packed(), engineResult(picture, "AE0", "slider=0.4;"));
  natives.release(handle);
}

TEST_F(EnhancementNatives, TakeFacesAnywhereAndOfAnyKind) {
  const float infinity = std::numeric_limits<float>::infinity();
  const float nan = std::numeric_limits<float>::quiet_NaN();
  const jlong handle = open(photo);
  FakeFaces faces{{-1.5f, -0.01f, 2, 3}, {1, 1, 0, 0}, {nan, -infinity, infinity, 1e38f}};
  natives.preprocess(faces, handle);
  EXPECT_THAT(
      takeLogLines(),
      ElementsAre("3 QuenbyLib: face bb: [-96 128 144 0]", "3 QuenbyLib: face bb: [64 0 0 48]",
                  "3 QuenbyLib: face bb: [0 2147483647 2147483647 -2147483648]"));
  natives.apply(handle, output.reference(), ae, slider);
  natives.release(handle);
}

TEST_F(EnhancementNatives, HoldNoLocalReferencesForManyFaces) {
  const jlong handle = open(photo);
  FakeFaces faces{{0, 0, 1, 1}};
  faces.elements.resize(5000, faces.elements[0]);
  natives.preprocess(faces, handle);
  EXPECT_LE(env.mostLocalReferences, 2);
  natives.release(handle);
}

TEST_F(EnhancementNatives, PrepareFiltersAnewAfterNewFaces) {
  const jlong handle = natives.init(photo.reference());
  FakeFaces first{{0.2f, 0.2f, 0.4f, 0.4f}}, second{{0.1f, 0.1f, 0.9f, 0.9f}};
  FakeBitmap withFirst(64, 48), withSecond(64, 48), again(64, 48);
  natives.preprocess(first, handle);
  natives.apply(handle, withFirst.reference(), ae, slider);
  natives.preprocess(second, handle);
  natives.apply(handle, withSecond.reference(), ae, slider);
  EXPECT_NE(withFirst.packed(), withSecond.packed());
  natives.preprocess(first, handle);
  natives.apply(handle, again.reference(), ae, slider);
  EXPECT_EQ(again.packed(), withFirst.packed());
  natives.release(handle);
}

TEST_F(EnhancementNatives, GiveThePhotoForAnUnknownFilterName) {
  const jlong handle = open(photo);
  FakeString unknown("NoSuchFilter");
  for (const jstring name : {static_cast<jstring>(unknown), static_cast<jstring>(empty),
                             static_cast<jstring>(nullptr)}) {
    FakeBitmap copy(64, 48);
    natives.apply(handle, copy.reference(), name, slider);
    EXPECT_EQ(copy.packed(), bytesOf(picture));
  }
  EXPECT_THAT(takeLogLines(), IsEmpty());
  natives.release(handle);
}

TEST_F(EnhancementNatives, TakeNullParametersForNone) {
  const jlong handle = open(photo);
  natives.apply(handle, output.reference(), passThrough, nullptr);
  EXPECT_EQ(output.packed(), bytesOf(picture));
  natives.apply(handle, output.reference(), ae, nullptr);
  EXPECT_EQ(env.takeException(), "java/lang/IllegalArgumentException: map::at");
  natives.release(handle);
}

TEST_F(EnhancementNatives, RaiseIllegalArgumentForAMissingOrUnreadableParameter) {
  const jlong handle = open(photo);
  const std::vector<std::uint8_t> before = output.packed();
  natives.apply(handle, output.reference(), ae, empty);
  EXPECT_EQ(env.takeException(), "java/lang/IllegalArgumentException: map::at");
  FakeString unreadable("slider=much;");
  natives.apply(handle, output.reference(), ae, unreadable);
  EXPECT_THAT(env.takeException(), testing::StartsWith("java/lang/IllegalArgumentException: bad"));
  EXPECT_EQ(output.packed(), before);
  natives.release(handle);
}

TEST_F(EnhancementNatives, TreatMasksThatWereNeverComputedAsOff) {
  const jlong handle = open(photo);
  FakeString global("gtmOnly=true;slider=0.6;"), local("slider=0.6;");
  natives.apply(handle, output.reference(), ae, global);
  const std::vector<std::uint8_t> withoutMasks = output.packed();
  natives.apply(handle, output.reference(), ae, local);
  EXPECT_EQ(output.packed(), withoutMasks);
  natives.release(handle);
}

TEST_F(EnhancementNatives, WriteNothingIntoABitmapThatIsTooSmall) {
  const jlong handle = open(photo);
  for (const auto& [width, height] : {std::pair{63u, 48u}, {64u, 47u}, {128u, 24u}, {0u, 0u}}) {
    FakeBitmap small(width, height);
    natives.apply(handle, small.reference(), passThrough, empty);
    EXPECT_EQ(small.bytes, FakeBitmap(width, height).bytes);
    EXPECT_THAT(takeLogLines(),
                ElementsAre("6 QuenbyLib: the output bitmap [" + std::to_string(width) + ", " +
                            std::to_string(height) + "] is smaller than the photo [64, 48]"));
  }
  natives.release(handle);
}

TEST_F(EnhancementNatives, WriteIntoTheCornerOfALargerBitmap) {
  const jlong handle = open(photo);
  FakeBitmap large(70, 50);
  natives.apply(handle, large.reference(), passThrough, empty);
  EXPECT_EQ(std::vector(large.bytes.begin(), large.bytes.begin() + 64 * 4),
            std::vector(photo.bytes.begin(), photo.bytes.begin() + 64 * 4));
  EXPECT_EQ(large.bytes[64 * 4], 0xEE);
  EXPECT_EQ(large.bytes[48 * 70 * 4], 0xEE);
  natives.release(handle);
}

TEST_F(EnhancementNatives, WriteNothingIntoAnotherFormatOrALockedOutBitmap) {
  const jlong handle = open(photo);
  output.info.format = ANDROID_BITMAP_FORMAT_RGB_565;
  natives.apply(handle, output.reference(), passThrough, empty);
  EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: bitmap format 4 is not RGBA_8888"));
  output.info.format = ANDROID_BITMAP_FORMAT_RGBA_8888;
  output.lockResult = -1;
  natives.apply(handle, output.reference(), passThrough, empty);
  EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: AndroidBitmap_lockPixels failed"));
  natives.apply(handle, nullptr, passThrough, empty);
  EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: AndroidBitmap_lockPixels failed"));
  output.lockResult = 0;
  output.infoResult = -3;
  natives.apply(handle, output.reference(), passThrough, empty);
  EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: AndroidBitmap_getInfo failed: -3"));
  EXPECT_EQ(output.locks, 0);
  EXPECT_EQ(output.bytes, FakeBitmap(64, 48).bytes);
  natives.release(handle);
}

TEST_F(EnhancementNatives, LeaveTheOutputAloneBeforePreprocess) {
  const jlong handle = natives.init(photo.reference());
  takeLogLines();
  natives.apply(handle, output.reference(), passThrough, empty);
  EXPECT_THAT(takeLogLines(), ElementsAre("6 QuenbyLib: applyAutoEnhanceFilter before preprocess"));
  EXPECT_EQ(output.bytes, FakeBitmap(64, 48).bytes);
  natives.release(handle);
}

TEST_F(EnhancementNatives, DoNothingForHandlesThatAreNoSession) {
  const jlong stale = open(photo);
  natives.release(stale);
  for (const jlong handle :
       {jlong{0}, jlong{1}, jlong{-1}, stale, stale + 8, std::numeric_limits<jlong>::min(),
        std::numeric_limits<jlong>::max()}) {
    const std::string line = "6 QuenbyLib: no session has the handle " + std::to_string(handle);
    natives.preprocess(noFaces, handle);
    natives.apply(handle, output.reference(), passThrough, empty);
    EXPECT_THAT(takeLogLines(), ElementsAre(line, line));
    natives.release(handle);
    if (handle == 0) {
      EXPECT_THAT(takeLogLines(), IsEmpty());
    } else {
      EXPECT_THAT(takeLogLines(), ElementsAre(line));
    }
  }
  EXPECT_EQ(output.bytes, FakeBitmap(64, 48).bytes);
}

TEST_F(EnhancementNatives, ReachNoLaterSessionByAnOldHandle) {
  const jlong stale = open(photo);
  natives.release(stale);
  FakeBitmap other(8, 8), untouched(64, 48);
  for (int i = 0; i < 20'000; ++i) {
    const jlong handle = natives.init(other.reference());
    ASSERT_NE(handle, stale);
    natives.preprocess(nullptr, handle);
    natives.apply(stale, untouched.reference(), passThrough, empty);
    natives.preprocess(noFaces, stale);
    natives.release(stale);
    ASSERT_EQ(quenby::openSessions().size(), 1u) << i;
    natives.release(handle);
  }
  EXPECT_EQ(untouched.bytes, FakeBitmap(64, 48).bytes);
  EXPECT_EQ(untouched.timesLocked, 0);
  takeLogLines();
}

TEST_F(EnhancementNatives, WorkOnABitmapWithoutPixels) {
  for (const auto& [width, height] : {std::pair{0u, 0u}, {5u, 0u}, {0u, 5u}}) {
    FakeBitmap nothing(width, height), nothingOut(width, height);
    const jlong handle = open(nothing);
    EXPECT_NE(handle, 0);
    for (const std::string& name : filterNames()) {
      FakeString filter(name);
      natives.apply(handle, nothingOut.reference(), filter, slider);
    }
    natives.release(handle);
  }
}

}  // namespace
}  // namespace pelorin::test_support
