#include <android/bitmap.h>
#include <gtest/gtest.h>

#include "tests/jni/support/fake_environment.h"

namespace pelorin::test_support {
namespace {

class DesktopBitmap : public testing::Test {
 protected:
  ~DesktopBitmap() override { EXPECT_EQ(env.violations(), ""); }

  jobject reference() { return reinterpret_cast<jobject>(&bitmap); }

  FakeEnvironment env;
  char pixels[64];
  FakeObject buffer{.className = "java/nio/ByteBuffer", .address = pixels};
  FakeObject bitmap{
      .className = "android/graphics/Bitmap",
      .elements = {&buffer},
      .ints = {{"width", 3}, {"height", 4}, {"stride", 16}, {"format", 1}, {"locks", 0}}};
};

TEST_F(DesktopBitmap, TellsWhatItIs) {
  AndroidBitmapInfo info{};
  EXPECT_EQ(AndroidBitmap_getInfo(&env, reference(), &info), ANDROID_BITMAP_RESULT_SUCCESS);
  EXPECT_EQ(info.width, 3u);
  EXPECT_EQ(info.height, 4u);
  EXPECT_EQ(info.stride, 16u);
  EXPECT_EQ(info.format, ANDROID_BITMAP_FORMAT_RGBA_8888);
}

TEST_F(DesktopBitmap, LocksAndUnlocks) {
  void* address = nullptr;
  EXPECT_EQ(AndroidBitmap_lockPixels(&env, reference(), &address), ANDROID_BITMAP_RESULT_SUCCESS);
  EXPECT_EQ(address, pixels);
  EXPECT_EQ(bitmap.ints["locks"], 1);
  EXPECT_EQ(AndroidBitmap_unlockPixels(&env, reference()), ANDROID_BITMAP_RESULT_SUCCESS);
  EXPECT_EQ(bitmap.ints["locks"], 0);
}

TEST_F(DesktopBitmap, IsNotLockedWhenRecycled) {
  bitmap.elements.clear();
  void* address = pixels;
  EXPECT_EQ(AndroidBitmap_lockPixels(&env, reference(), &address),
            ANDROID_BITMAP_RESULT_BAD_PARAMETER);
  EXPECT_EQ(address, nullptr);
  EXPECT_EQ(bitmap.ints["locks"], 0);
}

TEST_F(DesktopBitmap, IsNotLockedWithoutDirectMemory) {
  buffer.address = nullptr;
  void* address = pixels;
  EXPECT_EQ(AndroidBitmap_lockPixels(&env, reference(), &address),
            ANDROID_BITMAP_RESULT_ALLOCATION_FAILED);
  EXPECT_EQ(bitmap.ints["locks"], 0);
}

TEST_F(DesktopBitmap, IsABadParameterWhenNull) {
  AndroidBitmapInfo info;
  void* address;
  EXPECT_EQ(AndroidBitmap_getInfo(&env, nullptr, &info), ANDROID_BITMAP_RESULT_BAD_PARAMETER);
  EXPECT_EQ(AndroidBitmap_getInfo(&env, reference(), nullptr), ANDROID_BITMAP_RESULT_BAD_PARAMETER);
  EXPECT_EQ(AndroidBitmap_lockPixels(&env, nullptr, &address), ANDROID_BITMAP_RESULT_BAD_PARAMETER);
  EXPECT_EQ(AndroidBitmap_lockPixels(&env, reference(), nullptr),
            ANDROID_BITMAP_RESULT_BAD_PARAMETER);
  EXPECT_EQ(AndroidBitmap_unlockPixels(&env, nullptr), ANDROID_BITMAP_RESULT_BAD_PARAMETER);
}

TEST_F(DesktopBitmap, LeavesAJavaExceptionPending) {
  AndroidBitmapInfo info;
  void* address;
  for (int call = 1; call <= 4; ++call) {
    env.failCall(call);
    EXPECT_EQ(AndroidBitmap_getInfo(&env, reference(), &info), ANDROID_BITMAP_RESULT_JNI_EXCEPTION);
    EXPECT_EQ(env.takeException().find("test/Injected"), 0u);
  }
  for (int call = 1; call <= 2; ++call) {
    env.failCall(call);
    EXPECT_EQ(AndroidBitmap_lockPixels(&env, reference(), &address),
              ANDROID_BITMAP_RESULT_JNI_EXCEPTION);
    EXPECT_EQ(env.takeException().find("test/Injected"), 0u);
    env.failCall(call);
    EXPECT_EQ(AndroidBitmap_unlockPixels(&env, reference()), ANDROID_BITMAP_RESULT_JNI_EXCEPTION);
    EXPECT_EQ(env.takeException().find("test/Injected"), 0u);
  }
}

}  // namespace
}  // namespace pelorin::test_support
