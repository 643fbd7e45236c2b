// Linked into the command, keeps it from instruction sets above AVX2.
#include <hwy/targets.h>

namespace {
[[gnu::constructor]] void keepToAvx2() {
  // Highway's better sets are its lower bits.
  hwy::SetSupportedTargetsForTest(hwy::SupportedTargets() & ~(HWY_AVX2 - 1));
}
}  // namespace
