#include "platform/pnjni/exceptions.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <boost/lexical_cast.hpp>
#include <new>
#include <stdexcept>
#include <system_error>

#include "platform/pn/jni_lookup.h"
#include "platform/pnjni/environment.h"
#include "tests/jni/support/fake_environment.h"

namespace pelorin::jni {
namespace {

using test_support::FakeEnvironment;
using testing::StartsWith;

class ExceptionWrapper : public testing::Test {
 protected:
  ExceptionWrapper() {
    initialize(FakeEnvironment::machine(), [] {});
  }
  ~ExceptionWrapper() override { EXPECT_EQ(env.violations(), ""); }

  FakeEnvironment env;
};

/// What the native of these tests does.
void (*action)() = nullptr;

template <typename Result>
Result native(JNIEnv*, jobject, jint argument) {
  if (action != nullptr) action();
  return static_cast<Result>(argument);
}

template <typename Result>
Result callWrapped(JNIEnv* env, jint argument) {
  void* const wrapped = exceptionWrapJNIMethod<&native<Result>>();
  return reinterpret_cast<Result (*)(JNIEnv*, jobject, jint)>(wrapped)(env, nullptr, argument);
}

TEST_F(ExceptionWrapper, PassesArgumentsAndResultThrough) {
  action = nullptr;
  EXPECT_EQ(callWrapped<jlong>(&env, 12), 12);
  EXPECT_EQ(callWrapped<jfloat>(&env, -3), -3.0f);
  callWrapped<void>(&env, 1);
  EXPECT_FALSE(env.pending());
}

TEST_F(ExceptionWrapper, ReturnsZeroWithAnExceptionPending) {
  action = [] { throw std::runtime_error("broken"); };
  EXPECT_EQ(callWrapped<jlong>(&env, 12), 0);
  EXPECT_EQ(env.takeException(), "java/lang/RuntimeException: broken");
  EXPECT_EQ(callWrapped<jboolean>(&env, 1), JNI_FALSE);
  EXPECT_EQ(env.takeException(), "java/lang/RuntimeException: broken");
  EXPECT_EQ(callWrapped<jfloat>(&env, 12), 0.0f);
  EXPECT_EQ(env.takeException(), "java/lang/RuntimeException: broken");
  callWrapped<void>(&env, 1);
  EXPECT_EQ(env.takeException(), "java/lang/RuntimeException: broken");
}

TEST_F(ExceptionWrapper, ChoosesTheJavaException) {
  const auto translated = [&](void (*thrower)()) {
    action = thrower;
    callWrapped<jint>(&env, 1);
    return env.takeException();
  };
  EXPECT_EQ(translated([] { throw std::bad_alloc(); }),
            "java/lang/OutOfMemoryError: out of native memory");
  EXPECT_EQ(translated([] { throw std::out_of_range("map::at"); }),
            "java/lang/IllegalArgumentException: map::at");
  EXPECT_EQ(translated([] { throw std::invalid_argument("null"); }),
            "java/lang/IllegalArgumentException: null");
  EXPECT_THAT(translated([] { boost::lexical_cast<float>("much"); }),
              StartsWith("java/lang/IllegalArgumentException: bad lexical cast"));
  EXPECT_EQ(translated([] {
              throw std::system_error(std::make_error_code(std::errc::no_space_on_device), "a.jpg");
            }),
            "java/io/IOException: a.jpg: No space left on device");
  EXPECT_EQ(translated([] { throw std::logic_error("odd"); }), "java/lang/RuntimeException: odd");
  EXPECT_EQ(translated([] { throw 7; }), "java/lang/RuntimeException: an unknown native error");
}

TEST_F(ExceptionWrapper, LeavesAPendingJavaExceptionAlone) {
  action = [] {
    static_cast<FakeEnvironment*>(Environment::current())->raise("test/First", "cause");
    throw std::runtime_error("later");
  };
  EXPECT_EQ(callWrapped<jint>(&env, 1), 0);
  EXPECT_EQ(env.takeException(), "test/First: cause");
}

TEST(ThrowCppExceptionIf, ThrowsIfSo) {
  EXPECT_NO_THROW(throwCppExceptionIf(false));
  EXPECT_THROW(throwCppExceptionIf(true), JniError);
}

}  // namespace
}  // namespace pelorin::jni
