// Runs every kernel once under valgrind's callgrind, which writes what each executed into a file of
// its own; check.sh reads them. See there for why instructions and not time.
#include <hwy/targets.h>
#include <valgrind/callgrind.h>

#include <cstdio>
#include <string>

#include "tests/kernels/kernels.h"

int main() {
  using namespace pelorin;
  if (RUNNING_ON_VALGRIND == 0) {
    std::fputs("to be run by valgrind --tool=callgrind --collect-atstart=no\n", stderr);
    return 2;
  }
  // Odd sizes: the pixels that fill no whole vector are there, but do not rule.
  const auto photo = test_support::photoLikePicture(1021, 509, 1);
  std::printf("pixels %zu\n", photo.pixelCount());
  for (const test_support::KernelRow& row : test_support::kernelRows()) {
    const test_support::Kernel kernel = row.on(photo);
    for (const std::int64_t target : hwy::SupportedAndGeneratedTargets()) {
      hwy::SetSupportedTargetsForTest(target);
      kernel.vectors();  // tables that the first call makes are not its own
      const std::string label = std::string(hwy::TargetName(target)) + " " + row.name;
      CALLGRIND_ZERO_STATS;
      CALLGRIND_TOGGLE_COLLECT;
      kernel.vectors();
      CALLGRIND_TOGGLE_COLLECT;
      CALLGRIND_DUMP_STATS_AT(label.c_str());
      hwy::SetSupportedTargetsForTest(0);
    }
  }
}
