#pragma once

#include <gtest/gtest.h>
#include <hwy/highway.h>

#include <vector>

namespace pelorin::test_support {

/// Calls `body` once with each instruction set that this machine has and kernels are built for,
/// together with those it contains, since not every kernel is built for each. Where the set is
/// chosen at build time there is one call.
template <typename Body>
void onEveryInstructionSet(Body body) {
#ifdef HWY_COMPILE_ONLY_STATIC
  body();
#else
  std::vector<std::int64_t> targets = hwy::SupportedAndGeneratedTargets();
  // Some kernels are built for one more.
  if ((hwy::SupportedTargets() & HWY_AVX3_DL) != 0) targets.push_back(HWY_AVX3_DL);
  const std::int64_t all = hwy::SupportedTargets();
  for (const std::int64_t target : targets) {
    SCOPED_TRACE(hwy::TargetName(target));
    hwy::SetSupportedTargetsForTest(all & -target);  // the better sets are the lower bits
    body();
    EXPECT_TRUE(hwy::GetChosenTarget().IsInitialized()) << "no kernel was called";
    hwy::SetSupportedTargetsForTest(0);
  }
#endif
}

}  // namespace pelorin::test_support
