#include "platform/pn/jni_lookup.h"

#include <gtest/gtest.h>

#include <string>

#include "tests/jni/support/fake_environment.h"

namespace pelorin {
namespace {

using test_support::FakeEnvironment;

TEST(FindClassOrThrow, GivesALocalReference) {
  FakeEnvironment env;
  const jclass found = findClassOrThrow(&env, "android/graphics/RectF");
  EXPECT_EQ(env.resolve(found, "test")->text, "android/graphics/RectF");
  EXPECT_EQ(env.localReferences, 1);
}

TEST(FindClassOrThrow, ThrowsAndLeavesTheJavaExceptionPending) {
  FakeEnvironment env;
  EXPECT_THROW(findClassOrThrow(&env, "no/Such"), JniError);
  EXPECT_EQ(env.takeException(), "java/lang/NoClassDefFoundError: no/Such");
}

TEST(GetFieldIdOrThrow, ThrowsAndLeavesTheJavaExceptionPending) {
  FakeEnvironment env;
  const jclass rectF = findClassOrThrow(&env, "android/graphics/RectF");
  EXPECT_NE(getFieldIdOrThrow(&env, rectF, "left", "F"), nullptr);
  EXPECT_THROW(getFieldIdOrThrow(&env, rectF, "middle", "F"), JniError);
  EXPECT_EQ(env.takeException(), "java/lang/NoSuchFieldError: middle");
}

TEST(ThrowOutOfMemoryError, FormatsItsMessage) {
  FakeEnvironment env;
  throwOutOfMemoryError(&env, "%s ran out of memory at %d", "it", 7);
  EXPECT_EQ(env.takeException(), "java/lang/OutOfMemoryError: it ran out of memory at 7");
  EXPECT_EQ(env.violations(), "");
}

TEST(ThrowOutOfMemoryError, CutsALongMessage) {
  FakeEnvironment env;
  throwOutOfMemoryError(&env, "%s", std::string(1000, 'x').c_str());
  EXPECT_EQ(env.takeException(), "java/lang/OutOfMemoryError: " + std::string(255, 'x'));
}

TEST(ThrowOutOfMemoryError, LeavesAnEarlierExceptionAlone) {
  FakeEnvironment env;
  env.raise("test/First", "cause");
  throwOutOfMemoryError(&env, "out of memory");
  EXPECT_EQ(env.takeException(), "test/First: cause");
  EXPECT_EQ(env.violations(), "");
}

}  // namespace
}  // namespace pelorin
