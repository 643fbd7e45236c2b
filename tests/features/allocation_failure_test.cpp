// Linked so that every `malloc`, `realloc` and `free` of the engine and of this file comes through
// here; compilers turn a `realloc` of nothing into a `malloc`.
#include <gtest/gtest.h>

#include <limits>
#include <new>

#include "image_processing/features/brief.h"
#include "image_processing/features/fast.h"
#include "tests/features/fast_variants.h"

namespace {
int allocationsUntilFailure = std::numeric_limits<int>::max();
int blocksInUse = 0;
}  // namespace

extern "C" {
void* __real_malloc(std::size_t size);
void* __real_realloc(void* memory, std::size_t size);
void __real_free(void* memory);

void* __wrap_malloc(std::size_t size) {
  if (allocationsUntilFailure == 0) return nullptr;
  --allocationsUntilFailure;
  ++blocksInUse;
  return __real_malloc(size);
}

void* __wrap_realloc(void* memory, std::size_t size) {
  if (memory == nullptr) return __wrap_malloc(size);
  if (allocationsUntilFailure == 0) return nullptr;
  --allocationsUntilFailure;
  return __real_realloc(memory, size);
}

void __wrap_free(void* memory) {
  if (memory != nullptr) --blocksInUse;
  __real_free(memory);
}
}

namespace pelorin::test_support {
namespace {

// Lets the first, then the second, ... allocation of `function` fail, until it needs no more. On
// failure it must return null, write 0 and hold no memory.
template <typename Function>
void expectCleanFailures(int fewestAllocations, Function function) {
  for (int successes = 0;; ++successes) {
    allocationsUntilFailure = successes;
    blocksInUse = 0;
    int count = -1;
    auto* const array = function(&count);
    const bool failed = allocationsUntilFailure == 0 && array == nullptr;
    allocationsUntilFailure = std::numeric_limits<int>::max();
    if (!failed) {
      EXPECT_NE(array, nullptr);
      EXPECT_EQ(blocksInUse, 1) << "the array and nothing else";
      EXPECT_GE(successes, fewestAllocations);
      std::free(array);
      return;
    }
    EXPECT_EQ(count, 0) << "allocation " << successes;
    EXPECT_EQ(blocksInUse, 0) << "allocation " << successes;
  }
}

// Enough corners for several growths of the array.
const GreyImage& crowdedImage() {
  static const GreyImage image = greyNoise(150, 100, 1);
  return image;
}

TEST(AllocationFailure, MakesDetectionReturnNullAndLeavesNothingBehind) {
  for (const int b : {2, -5}) {
    expectCleanFailures(b < 0 ? 5 : 4, [&](int* count) {
      return fast9_detect(crowdedImage().data.get(), 150, 100, 150, b, count);
    });
  }
}

TEST(AllocationFailure, MakesAnEmptyDetectionReturnNullToo) {
  expectCleanFailures(1, [](int* count) { return fast9_detect(nullptr, 0, 0, 0, 20, count); });
}

TEST(AllocationFailure, MakesScoringReturnNullAndLeavesNothingBehind) {
  const std::vector<xy> corners = detect(fast9_detect, crowdedImage(), 30);
  expectCleanFailures(1, [&](int* count) {
    *count = 0;  // scoring writes none
    return fast9_score(crowdedImage().data.get(), 150, corners.data(),
                       static_cast<int>(corners.size()), 30);
  });
}

TEST(AllocationFailure, MakesDetectionWithSuppressionReturnNullAndLeavesNothingBehind) {
  for (const int b : {2, -5}) {
    expectCleanFailures(b < 0 ? 7 : 3, [&](int* count) {
      return fast9_detect_nonmax(crowdedImage().data.get(), 150, 100, 150, b, count);
    });
  }
}

TEST(AllocationFailure, MakesSuppressionReturnNullAndLeavesNothingBehind) {
  const std::vector<xy> corners = detect(fast9_detect, crowdedImage(), 30);
  const std::vector<int> scores(corners.size(), 1);
  expectCleanFailures(1, [&](int* count) {
    return nonmax_suppression(corners.data(), scores.data(), static_cast<int>(corners.size()),
                              count);
  });
}

TEST(AllocationFailure, MakesDescriptorsThrowAndLeavesNothingBehind) {
  allocationsUntilFailure = 1;
  blocksInUse = 0;
  EXPECT_THROW(image_processing::computeBriefDescriptors(crowdedImage(), 20), std::bad_alloc);
  allocationsUntilFailure = std::numeric_limits<int>::max();
  EXPECT_EQ(blocksInUse, 0);
  EXPECT_FALSE(image_processing::computeBriefDescriptors(crowdedImage(), 20).empty());
  EXPECT_EQ(blocksInUse, 0);
}

}  // namespace
}  // namespace pelorin::test_support
