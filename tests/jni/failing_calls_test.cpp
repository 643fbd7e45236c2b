#include <gtest/gtest.h>

#include <functional>
#include <utility>

#include "jni/session_table.h"
#include "tests/jni/support/natives_fixture.h"
#include "tests/jni/support/whole_run.h"

namespace pelorin::test_support {
namespace {

// Every call into Java or the bitmap library that can fail does so once in each native, with and
// without an exception, alone and with all later ones. The fixture checks that nobody calls on while one is pending, and that
// references, characters and locks are given back.
class FailingCalls : public NativesTest {
 protected:
  FailingCalls() {
    handle = natives.init(run.photo.reference());
    natives.preprocess(run.faces, handle);
  }
  ~FailingCalls() override { natives.release(handle); }

  /// Runs `native` once for each of its calls and way of failing, with `check` after each.
  void failEachCall(const std::function<void()>& native, int expectedCalls) {
    env.failCall(0);
    native();
    const int calls = env.fallibleCalls();
    EXPECT_EQ(calls, expectedCalls);
    for (int call = 1; call <= calls; ++call) {
      for (const auto& [failure, later] : waysToFail) {
        const std::size_t sessions = quenby::openSessions().size();
        env.failCall(call, failure, later);
        native();
        EXPECT_TRUE(env.failed());
        env.failCall(0);
        const std::string exception = env.takeException();
        if (failure == Failure::withException) {
          EXPECT_EQ(exception.find("test/Injected: "), 0u) << exception;
        }
        EXPECT_EQ(env.violations(), "") << call;
        EXPECT_EQ(run.photo.locks + run.output.locks + run.padded.locks, 0) << call;
        EXPECT_EQ(quenby::openSessions().size(), sessions) << call;
        ++faults;
      }
    }
    EXPECT_EQ(run.results(), before) << "a run after the failures differs";
    takeLogLines();
    printf("%d failing calls\n", faults);
  }

  using Failure = FakeEnvironment::Failure;
  using Later = FakeEnvironment::Later;
  static constexpr std::pair<Failure, Later> waysToFail[] = {
      {Failure::withException, Later::succeed},
      {Failure::withoutException, Later::succeed},
      {Failure::withException, Later::fail},
      {Failure::withoutException, Later::fail}};

  WholeRun run{natives};
  FakeFaces noFaces{};
  const std::vector<std::uint8_t> before = run.results();
  jlong handle = 0;
  int faults = 0;
};

TEST_F(FailingCalls, OfInit) {
  failEachCall(
      [&] {
        const jlong opened = natives.init(run.photo.reference());
        EXPECT_EQ(opened == 0, env.failed());
        if (opened != 0) natives.release(opened);
      },
      3);
}

TEST_F(FailingCalls, OfPreprocess) {
  failEachCall([&] { natives.preprocess(run.faces, handle); }, 3);
}

TEST_F(FailingCalls, OfPreprocessWithoutFaces) {
  failEachCall([&] { natives.preprocess(noFaces, handle); }, 0);
}

TEST_F(FailingCalls, OfApplyAutoEnhanceFilter) {
  failEachCall([&] { natives.apply(handle, run.output.reference(), run.filter, run.params); }, 4);
}

TEST_F(FailingCalls, OfApplyAutoEnhanceFilterToJpegFile) {
  failEachCall(
      [&] { natives.applyToFile(run.input, run.file, 90, run.faces, 1, run.filter, run.params); },
      // The copy's path, the input's for messages, both for the rotation, two names, three faces, the
      // output's path.
      1 + 1 + 2 + 2 + 3 + 1);
}

TEST_F(FailingCalls, OfApplyAutoEnhanceFilterToJpegFileWithoutFaces) {
  failEachCall(
      [&] { natives.applyToFile(run.input, run.file, 90, noFaces, 1, run.filter, run.params); },
      1 + 1 + 2 + 2 + 1);
}

TEST_F(FailingCalls, OfApplyAutoEnhanceFilterToJpegFileTurnedInMemory) {
  FakeString nowhere("/dev/null");
  failEachCall(
      [&] { natives.applyToFile(run.input, nowhere, 90, run.faces, 1, run.filter, run.params); },
      // And the memory's path.
      10 + 1);
}

TEST_F(FailingCalls, OfSimilarityScore) {
  failEachCall(
      [&] {
        const float score =
            natives.similarity(run.photo.reference(), 1, 1, run.padded.reference(), 2, 2);
        EXPECT_EQ(score == -2222.0f, env.failed());
      },
      6);
}

TEST_F(FailingCalls, OfTheExceptionItself) {
  FakeString none("");
  for (int call = 3; call <= 4; ++call) {  // after the two names: find the class, throw
    for (const auto& [failure, later] : waysToFail) {
      env.failCall(call, failure, later);
      natives.apply(handle, run.output.reference(), run.filter, none);
      EXPECT_TRUE(env.failed());
      EXPECT_EQ(env.takeException().empty(), failure == Failure::withoutException);
      ++faults;
    }
  }
  printf("%d failing calls\n", faults);
}

}  // namespace
}  // namespace pelorin::test_support
