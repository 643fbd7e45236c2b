#include "platform/pnjni/environment.h"

#include <gtest/gtest.h>

#include <stdexcept>
#include <thread>

#include "platform/pn/jni_lookup.h"
#include "platform/pnjni/local_reference.h"
#include "tests/jni/support/fake_environment.h"

namespace pelorin::jni {
namespace {

using test_support::FakeEnvironment;

TEST(Environment, IsThatOfTheThread) {
  FakeEnvironment env;
  static JNIEnv* seen;
  EXPECT_EQ(initialize(FakeEnvironment::machine(), [] { seen = Environment::current(); }),
            JNI_VERSION_1_6);
  EXPECT_EQ(seen, &env);
  std::thread([] { EXPECT_THROW(Environment::current(), JniError); }).join();
}

TEST(Initialize, TurnsAnErrorIntoAJavaException) {
  FakeEnvironment env;
  EXPECT_EQ(initialize(FakeEnvironment::machine(), [] { throw std::runtime_error("no luck"); }),
            JNI_ERR);
  EXPECT_EQ(env.takeException(), "java/lang/RuntimeException: no luck");
}

TEST(LocalReference, IsDeletedWithItsScope) {
  FakeEnvironment env;
  initialize(FakeEnvironment::machine(), [] {});
  {
    LocalReference<jclass> found = findClassLocal("android/graphics/RectF");
    EXPECT_EQ(env.localReferences, 1);
    const LocalReference<jclass> moved = std::move(found);
    EXPECT_EQ(env.resolve(moved.get(), "test")->text, "android/graphics/RectF");
    EXPECT_EQ(env.localReferences, 1);
  }
  EXPECT_EQ(env.localReferences, 0);
  EXPECT_THROW(findClassLocal("no/Such"), JniError);
  env.takeException();
}

}  // namespace
}  // namespace pelorin::jni
