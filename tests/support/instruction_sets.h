#pragma once

#include <gtest/gtest.h>
#include <hwy/highway.h>

#include <cstdint>
#include <vector>

namespace pelorin::test_support {

#ifdef HWY_COMPILE_ONLY_STATIC
constexpr bool setIsChosenAtBuildTime = true;
#else
constexpr bool setIsChosenAtBuildTime = false;
#endif

/// The instruction sets that this machine has and kernels are built for.
/// @param rare  further sets that the kernels under test are built for, such as HWY_AVX3_DL.
inline std::vector<std::int64_t> instructionSets([[maybe_unused]] std::int64_t rare = 0) {
  if constexpr (setIsChosenAtBuildTime) {
    return {HWY_STATIC_TARGET};
  } else {
    std::vector<std::int64_t> sets;
    const std::int64_t all = hwy::SupportedTargets() & (HWY_TARGETS | rare);
    for (std::int64_t left = all; left != 0; left &= left - 1) sets.push_back(left & -left);
    return sets;
  }
}

/// Makes kernels use `set`, or the next best one they are built for, until the end of the scope.
class UseInstructionSet {
 public:
  explicit UseInstructionSet(std::int64_t set) {
    if constexpr (!setIsChosenAtBuildTime) {
      hwy::SetSupportedTargetsForTest(hwy::SupportedTargets() & -set);
    }
  }
  ~UseInstructionSet() {
    if constexpr (!setIsChosenAtBuildTime) hwy::SetSupportedTargetsForTest(0);
  }
  UseInstructionSet(const UseInstructionSet&) = delete;
  UseInstructionSet& operator=(const UseInstructionSet&) = delete;
};

/// Calls `body` once with each of `instructionSets(rare)`.
template <typename Body>
void onEveryInstructionSet(Body body, std::int64_t rare = 0) {
  for (const std::int64_t set : instructionSets(rare)) {
    SCOPED_TRACE(hwy::TargetName(set));
    const UseInstructionSet use(set);
    body();
    if constexpr (!setIsChosenAtBuildTime) {
      EXPECT_TRUE(hwy::GetChosenTarget().IsInitialized()) << "no kernel was called";
    }
  }
}

}  // namespace pelorin::test_support
