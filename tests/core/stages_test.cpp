#include "image_processing/core/stages.h"

#include <gtest/gtest.h>

#include <atomic>
#include <stdexcept>
#include <vector>

#include "photo/thread_workers.h"

namespace pelorin::image_processing {
namespace {

TEST(PartStart, DividesEvenlyWithoutGaps) {
  for (const std::uint64_t total : {0u, 1u, 7u, 16u, 1000u}) {
    for (const std::size_t parts : {1u, 3u, 16u}) {
      EXPECT_EQ(partStart(total, 0, parts), 0u);
      EXPECT_EQ(partStart(total, parts, parts), total);
      for (std::size_t i = 0; i < parts; ++i) {
        const std::uint64_t size = partStart(total, i + 1, parts) - partStart(total, i, parts);
        EXPECT_TRUE(size == total / parts || size == total / parts + 1);
      }
    }
  }
  EXPECT_EQ(partStart(~std::uint64_t{0}, 3, 3), ~std::uint64_t{0});
}

TEST(SharedBandHeight, IsAMultipleOf16) {
  EXPECT_EQ(sharedBandHeight(4000, 3000), 32u);
  EXPECT_EQ(sharedBandHeight(65500, 65500), 16u);
  EXPECT_EQ(sharedBandHeight(100, 1000), 112u);
  EXPECT_EQ(sharedBandHeight(0, 0), 16u);
}

TEST(RunStages, WithNoWorkersOrOneTakesEachBandThroughAllStages) {
  struct One : Workers {
    std::size_t count() const override { return 1; }
    void run(std::size_t, const Task&) override { ADD_FAILURE() << "has nothing to share"; }
  } one;
  std::vector<int> done;
  const auto note = [&](int stage) {
    return [&done, stage](std::int64_t band, std::size_t task) {
      done.push_back(100 * static_cast<int>(band) + 10 * stage + static_cast<int>(task));
    };
  };
  for (Workers* const workers : {static_cast<Workers*>(nullptr), static_cast<Workers*>(&one)}) {
    done.clear();
    EXPECT_TRUE(runStages(2, {{1, note(0)}, {2, note(1)}, {1, note(2)}}, workers));
    EXPECT_EQ(done, (std::vector{0, 10, 11, 20, 100, 110, 111, 120}));
    EXPECT_EQ(bandsUnderWay(3, workers), 1);
  }
}

TEST(RunStages, ServesBandsInOrderAndEachStageAfterTheOneBefore) {
  constexpr std::int64_t bands = 200;
  for (const std::size_t threads : {1, 2, 3, 8}) {
    photo::ThreadWorkers workers(threads);
    // Plain numbers: the thread sanitizer sees whether the stages are kept apart.
    std::vector<int> read(bands), mapped(3 * bands);
    std::atomic<std::int64_t> next = 0;
    std::int64_t written = 0;
    const Stage reading = {1, [&](std::int64_t band, std::size_t) {
                             EXPECT_EQ(band, next++);
                             read[band] = 1;
                           }};
    const Stage mapping = {
        3, [&](std::int64_t band, std::size_t task) { mapped[3 * band + task] = read[band]; }};
    const Stage writing = {1, [&](std::int64_t band, std::size_t) {
                             EXPECT_EQ(band, written++);
                             for (int task = 0; task < 3; ++task)
                               EXPECT_EQ(mapped[3 * band + task], 1);
                             EXPECT_LE(next - band, bandsUnderWay(3, &workers));
                           }};
    EXPECT_TRUE(runStages(bands, {reading, mapping, writing}, &workers));
    EXPECT_EQ(written, bands);
  }
}

TEST(RunStages, GivesUpBetweenBands) {
  photo::ThreadWorkers workers(2);
  for (Workers* const some : {static_cast<Workers*>(nullptr), static_cast<Workers*>(&workers)}) {
    int asked = 0, begun = 0;
    const Stage stage = {1, [&](std::int64_t, std::size_t) { ++begun; }};
    EXPECT_FALSE(runStages(9, {stage}, some, [&] { return ++asked == 4; }));
    EXPECT_EQ(begun, 3);
  }
}

TEST(RunStages, AsksWhetherToGiveUpOnceAStepAndNotWhenAllIsDone) {
  photo::ThreadWorkers workers(2);
  const Stage stage = {1, [](std::int64_t, std::size_t) {}};
  for (const std::int64_t bands : {0, 1, 7}) {
    for (Workers* const some : {static_cast<Workers*>(nullptr), static_cast<Workers*>(&workers)}) {
      int asked = 0;
      EXPECT_TRUE(runStages(bands, {stage, stage, stage}, some, [&] { return ++asked < 0; }));
      // The last stages have the last bands later.
      EXPECT_EQ(asked, bands == 0 ? 0 : bands + bandsUnderWay(3, some) - 1);
    }
  }
}

TEST(RunStages, LetsErrorsThrough) {
  photo::ThreadWorkers workers(3);
  for (Workers* const some : {static_cast<Workers*>(nullptr), static_cast<Workers*>(&workers)}) {
    std::atomic<int> after = 0;
    const Stage failing = {1, [](std::int64_t band, std::size_t) {
                             if (band == 5) throw std::runtime_error("damaged");
                           }};
    const Stage next = {1, [&](std::int64_t band, std::size_t) { after += band >= 5; }};
    EXPECT_THROW(runStages(20, {failing, next}, some), std::runtime_error);
    EXPECT_EQ(after, 0);
  }
}

}  // namespace
}  // namespace pelorin::image_processing
