#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "jni/session_table.h"
#include "tests/jni/support/natives_fixture.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {
namespace {

class SharedSession : public NativesTest {
 protected:
  /// Runs `work` in threads with environments of their own.
  template <typename Work>
  void inThreads(int count, Work work) {
    std::vector<std::thread> threads;
    for (int i = 0; i < count; ++i) {
      threads.emplace_back([i, work] {
        FakeEnvironment own;
        work(i, own);
        EXPECT_EQ(own.takeException(), "");
        EXPECT_EQ(own.violations(), "");
      });
    }
    for (std::thread& thread : threads) thread.join();
  }

  const Image<RGBA8Pixel> picture = photoLikePicture(48, 36, 6);
  FakeBitmap photo{picture};
};

TEST_F(SharedSession, GivesEveryThreadTheEnginesBytes) {
  const std::string params = "slider=0.5;s1=0.4;s2=0.6;s3=0.5;s4=0.5;";
  const std::vector<std::string> filters = filterNames();
  std::vector<std::vector<std::uint8_t>> expected;
  for (const std::string& filter : filters)
    expected.push_back(engineResult(picture, filter, params));
  const jlong handle = natives.init(photo.reference());
  natives.preprocess(nullptr, handle);
  inThreads(8, [&](int thread, FakeEnvironment& env) {
    const Natives own(env);
    FakeString parameters(params);
    FakeBitmap output(48, 36);
    for (int i = 0; i < 20; ++i) {
      const std::size_t chosen = (thread + i) % filters.size();
      FakeString filter(filters[chosen]);
      own.apply(handle, output.reference(), filter, parameters);
      ASSERT_EQ(output.packed(), expected[chosen]) << filters[chosen];
    }
  });
  natives.release(handle);
}

TEST_F(SharedSession, OutlivesItsReleaseForCallsAtWork) {
  for (int round = 0; round < 10; ++round) {
    const jlong handle = natives.init(photo.reference());
    natives.preprocess(nullptr, handle);
    inThreads(4, [&](int thread, FakeEnvironment& env) {
      const Natives own(env);
      FakeString filter("AE0"), params("slider=0.4;");
      FakeBitmap output(48, 36);
      if (thread == 0) {
        own.preprocess(nullptr, handle);
        own.release(handle);
      } else {
        for (int i = 0; i < 4; ++i) own.apply(handle, output.reference(), filter, params);
      }
    });
  }
  EXPECT_EQ(quenby::openSessions().size(), 0u);
}

TEST_F(SharedSession, HasAHandleOfItsOwnInEveryThread) {
  inThreads(8, [&](int, FakeEnvironment& env) {
    const Natives own(env);
    FakeBitmap mine(picture), output(48, 36);
    FakeString filter("PassThrough");
    for (int i = 0; i < 50; ++i) {
      const jlong handle = own.init(mine.reference());
      own.preprocess(nullptr, handle);
      own.apply(handle, output.reference(), filter, nullptr);
      own.release(handle);
      own.release(handle);
    }
    EXPECT_EQ(output.packed(), bytesOf(picture));
  });
  EXPECT_EQ(quenby::openSessions().size(), 0u);
}

}  // namespace
}  // namespace pelorin::test_support
