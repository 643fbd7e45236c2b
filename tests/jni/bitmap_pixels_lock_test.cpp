#include "jni/bitmap_pixels_lock.h"

#include <gtest/gtest.h>

#include "tests/jni/support/fake_bitmap.h"

namespace pelorin::quenby {
namespace {

using test_support::FakeBitmap;
using test_support::FakeEnvironment;

class BitmapPixelsLockTest : public testing::Test {
 protected:
  ~BitmapPixelsLockTest() override {
    EXPECT_EQ(bitmap.locks, 0);
    EXPECT_EQ(env.violations(), "");
  }

  FakeEnvironment env;
  FakeBitmap bitmap{3, 2};
};

TEST_F(BitmapPixelsLockTest, HoldsThePixelsForAScope) {
  {
    const BitmapPixelsLock lock(&env, bitmap.reference());
    EXPECT_EQ(lock.pixels(), bitmap.bytes.data());
    EXPECT_EQ(bitmap.locks, 1);
  }
  EXPECT_EQ(bitmap.locks, 0);
}

TEST_F(BitmapPixelsLockTest, NeverUnlocksWhatItCouldNotLock) {
  bitmap.lockResult = -1;
  const BitmapPixelsLock lock(&env, bitmap.reference());
  EXPECT_EQ(lock.pixels(), nullptr);
}

TEST_F(BitmapPixelsLockTest, LeavesAPendingJavaExceptionPending) {
  {
    const BitmapPixelsLock lock(&env, bitmap.reference());
    env.raise("test/Pending", "from before");
  }
  EXPECT_EQ(env.takeException(), "test/Pending: from before");
}

}  // namespace
}  // namespace pelorin::quenby
