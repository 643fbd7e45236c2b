#include <gtest/gtest.h>

#include <functional>

#include "jni/session_table.h"
#include "tests/jni/support/natives_fixture.h"
#include "tests/jni/support/whole_run.h"
#include "tests/support/allocation_faults.h"
#include "tests/support/pictures.h"
#include "tests/support/slow_build.h"

namespace pelorin::test_support {
namespace {

using Later = AllocationFaults::Later;

// Every allocation of every native fails once, alone and with all later ones.
class OutOfMemory : public NativesTest {
 protected:
  OutOfMemory() {
    handle = natives.init(run.photo.reference());
    natives.preprocess(run.faces, handle);
    run.results();  // makes what lives as long as the process: tables, streams
    takeLogLines();
  }
  ~OutOfMemory() override {
    natives.release(handle);
    takeLogLines();
  }

  /// @param native   the call under faults; returns what the caller sees of it.
  /// @param message  of the OutOfMemoryError that must follow each fault that is noticed.
  template <typename Result>
  void failEachAllocation(const std::function<Result()>& native,
                          const std::function<void(Result, bool failed)>& check,
                          const std::string& message) {
    long faults = 0, unnoticed = 0;
    for (const Later later : {Later::succeed, Later::fail}) {
      for (long failing = 1;; failing += slowBuild && failing > 40 ? 9 : 1) {
        const long blocks = blocksInUse();
        Result result;
        long count;
        {
          const AllocationFaults fault(failing, later);
          result = native();
          count = fault.count();
        }
        const bool reached = count >= failing, failed = env.pending();
        if (failed) {
          EXPECT_EQ(env.takeException(), "java/lang/OutOfMemoryError: " + message) << failing;
        }
        check(result, failed);
        takeLogLines();
        EXPECT_EQ(blocksInUse(), blocks) << "leaked at allocation " << failing;
        if (!reached) {
          EXPECT_FALSE(failed);
          break;
        }
        ++faults;
        unnoticed += failed ? 0 : 1;
        EXPECT_EQ(env.violations(), "") << failing;
        EXPECT_EQ(run.photo.locks + run.output.locks + run.padded.locks, 0) << failing;
        if (faults % 64 == 1) {
          EXPECT_EQ(run.results(), before) << "after allocation " << failing;
        }
        if (HasFailure()) return;
      }
    }
    EXPECT_GT(faults, 0);
    EXPECT_LT(unnoticed, faults);
    EXPECT_EQ(run.results(), before);
    printf("%ld injected faults, %ld of them made up for\n", faults, unnoticed);
  }

  void failEachAllocationOfTheFileCall(jstring input, FakeString& output, int rotation) {
    const auto call = [&] {
      return natives.applyToFile(input, output, rotation, run.faces, 1, run.filter, run.params);
    };
    EXPECT_TRUE(call());
    const std::vector<std::uint8_t> expected = contentOf(output.text);
    const auto names = run.folder.content();
    bool decodingCanFail = false;
    failEachAllocation<bool>(
        call,
        [&](bool result, bool failed) {
          decodingCanFail |= failed && !result;  // until the picture is decoded
          if (!failed) {
            EXPECT_TRUE(result);
          }
        },
        "QuenbyLib JPEG filtering ran out of memory");
    EXPECT_TRUE(decodingCanFail);
    EXPECT_TRUE(call());
    EXPECT_EQ(contentOf(output.text), expected);
    EXPECT_EQ(run.folder.content(), names);
  }

  WholeRun run{natives};
  const std::vector<std::uint8_t> before = run.results();
  jlong handle = 0;
};

TEST_F(OutOfMemory, InInit) {
  failEachAllocation<jlong>([&] { return natives.init(run.photo.reference()); },
                            [&](jlong opened, bool failed) {
                              EXPECT_EQ(opened == 0, failed);
                              natives.release(opened);
                              EXPECT_EQ(quenby::openSessions().size(), 1u);
                            },
                            "QuenbyLib init ran out of memory");
}

TEST_F(OutOfMemory, InPreprocessKeepsThePreviousFilters) {
  const auto session = quenby::openSessions().find(handle);
  const auto* previous = session->filteredImage().get();
  failEachAllocation<int>(
      [&] {
        natives.preprocess(run.faces, handle);
        return 0;
      },
      [&](int, bool failed) {
        EXPECT_EQ(session->filteredImage().get() == previous, failed);
        previous = session->filteredImage().get();
      },
      "QuenbyLib preprocess ran out of memory");
}

TEST_F(OutOfMemory, InApplyAutoEnhanceFilterWithAnyFilter) {
  const auto session = quenby::openSessions().find(handle);
  for (const std::string& name : filterNames()) {
    FakeString filter(name);
    natives.preprocess(run.faces, handle);
    natives.apply(handle, run.output.reference(), filter, run.params);
    const std::vector<std::uint8_t> expected = run.output.packed();
    natives.preprocess(run.faces, handle);
    session->takeOutput();  // and drop it
    failEachAllocation<int>(
        [&] {
          natives.apply(handle, run.output.reference(), filter, run.params);
          return 0;
        },
        [&](int, bool failed) {
          if (!failed) {
            EXPECT_EQ(run.output.packed(), expected);
          }
          natives.preprocess(run.faces, handle);  // the next call prepares the filter again
          session->takeOutput();
        },
        "QuenbyLib real-time filtering ran out of memory");
  }
}

TEST_F(OutOfMemory, InApplyAutoEnhanceFilterWithAPreparedFilter) {
  natives.apply(handle, run.output.reference(), run.filter, run.params);
  const std::vector<std::uint8_t> expected = run.output.packed();
  const auto session = quenby::openSessions().find(handle);
  for (const bool hasSpareOutput : {false, true}) {
    const auto nextCall = [&] {
      Image<RGBA8Pixel> output = session->takeOutput();
      if (hasSpareOutput) session->giveOutputBack(std::move(output));
    };
    nextCall();
    failEachAllocation<int>(
        [&] {
          natives.apply(handle, run.output.reference(), run.filter, run.params);
          return 0;
        },
        [&](int, bool failed) {
          if (!failed) {
            EXPECT_EQ(run.output.packed(), expected);
          }
          nextCall();
        },
        "QuenbyLib real-time filtering ran out of memory");
  }
}

TEST_F(OutOfMemory, InApplyAutoEnhanceFilterToJpegFile) {
  failEachAllocationOfTheFileCall(run.input, run.file, 0);
}

TEST_F(OutOfMemory, InApplyAutoEnhanceFilterToJpegFileTurned) {
  failEachAllocationOfTheFileCall(run.input, run.file, 90);
}

TEST_F(OutOfMemory, InApplyAutoEnhanceFilterToJpegFileTurnedInMemory) {
  FakeString nowhere("/dev/null");
  failEachAllocationOfTheFileCall(run.input, nowhere, 90);
}

TEST_F(OutOfMemory, InApplyAutoEnhanceFilterToJpegFileTurnedByItsPixels) {
  FakeString strip(run.folder / "strip.jpg");
  writePicture(strip.text, photoLikePicture(40, 5, 3));
  if (contentOf(strip.text)[0] == 'R') GTEST_SKIP() << "the tests' own codec knows no blocks";
  failEachAllocationOfTheFileCall(strip, run.file, 90);
}

TEST_F(OutOfMemory, InSimilarityScore) {
  const float expected =
      natives.similarity(run.photo.reference(), 1, 2, run.padded.reference(), 3, 4);
  failEachAllocation<float>(
      [&] { return natives.similarity(run.photo.reference(), 1, 2, run.padded.reference(), 3, 4); },
      [&](float score, bool failed) { EXPECT_EQ(score, failed ? 0 : expected); },
      "out of native memory");
}

TEST_F(OutOfMemory, NeverInReleaseSession) {
  const jlong opened = natives.init(run.photo.reference());
  const AllocationFaults fault(1, Later::fail);
  natives.release(opened);
  EXPECT_EQ(fault.count(), 0);
}

}  // namespace
}  // namespace pelorin::test_support
