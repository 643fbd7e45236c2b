#pragma once

#include <gtest/gtest.h>
#include <hwy/highway.h>

namespace pelorin::test_support {

/// Calls `body` once with each instruction set that this machine has and the kernels were built
/// for. Where the set is chosen at build time there is one call.
template <typename Body>
void onEveryInstructionSet(Body body) {
#ifdef HWY_COMPILE_ONLY_STATIC
  body();
#else
  for (const std::int64_t target : hwy::SupportedAndGeneratedTargets()) {
    SCOPED_TRACE(hwy::TargetName(target));
    hwy::SetSupportedTargetsForTest(target);
    body();
    EXPECT_TRUE(hwy::GetChosenTarget().IsInitialized()) << "no kernel was called";
    hwy::SetSupportedTargetsForTest(0);
  }
#endif
}

}  // namespace pelorin::test_support
