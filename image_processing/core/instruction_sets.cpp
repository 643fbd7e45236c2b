// Which instruction sets the processor has, for Highway's headers. Its library would tell as well,
// but that measures the processor's clock whenever a process loads it, for longer than all else takes
// that happens before a photo is read.

#include <cpuid.h>
#include <hwy/highway.h>

#include <atomic>
#include <cstdarg>
#include <cstdint>
#include <cstdio>
#include <cstdlib>

namespace {

struct Registers {
  std::uint32_t a = 0, b = 0, c = 0, d = 0;
};

/// All 0 where the processor does not know the leaf.
Registers cpuid(std::uint32_t leaf) {
  Registers found;
  if (__get_cpuid_count(leaf, 0, &found.a, &found.b, &found.c, &found.d) == 0) return {};
  return found;
}

/// Which registers the system saves when it switches threads.
std::uint32_t savedRegisters() {
  std::uint32_t low = 0, high = 0;
  __asm__ volatile("xgetbv" : "=a"(low), "=d"(high) : "c"(0));
  return low;
}

/// Whether all of some bits are set, which are given by their numbers.
template <typename... Bits>
bool has(std::uint32_t word, Bits... bits) {
  return (... && ((word >> bits & 1) != 0));
}

std::int64_t findTargets() {
  const Registers basic = cpuid(1), extended = cpuid(7), more = cpuid(0x80000001);
  std::int64_t targets = HWY_ENABLED_BASELINE;

  const bool sse = has(basic.d, 25, 26) && has(basic.c, 0);  // SSE, SSE2; SSE3
  if (!sse || !has(basic.c, 9)) return targets;
  targets |= HWY_SSSE3;
  // SSE4.1, SSE4.2, multiplication without carry, AES
  if (!has(basic.c, 19, 20, 1, 25)) return targets;
  targets |= HWY_SSE4;

  const bool systemKnows = has(basic.c, 27);  // what it saves
  if (!systemKnows || !has(savedRegisters(), 1, 2)) return targets;
  // AVX, FMA, conversions of half floats; AVX2, two sets for bits; leading zeros
  if (!has(basic.c, 28, 12, 29) || !has(extended.b, 5, 3, 8) || !has(more.c, 5)) return targets;
  targets |= HWY_AVX2;

  // AVX-512: F, DQ, BW, VL
  if (!has(savedRegisters(), 5, 6, 7) || !has(extended.b, 16, 17, 30, 31)) return targets;
  targets |= HWY_AVX3;
  // VBMI, VBMI2, AES and multiplication without carry in vectors, VNNI, BITALG, counts of bits
  if (has(extended.c, 1, 6, 9, 10, 11, 12, 14)) targets |= HWY_AVX3_DL;
  return targets;
}

std::atomic<std::int64_t> targetsForTest = 0;

}  // namespace

// Weak, so that a program may have Highway's library beside these.
namespace hwy {

__attribute__((weak)) std::int64_t SupportedTargets() {
  static const std::int64_t found = findTargets();
  const std::int64_t forTest = targetsForTest;
  return forTest != 0 ? forTest : found;
}

__attribute__((weak)) ChosenTarget& GetChosenTarget() {
  static ChosenTarget chosen;
  return chosen;
}

__attribute__((weak)) void SetSupportedTargetsForTest(std::int64_t targets) {
  targetsForTest = targets;
  GetChosenTarget().DeInit();
}

__attribute__((weak)) void Abort(const char* file, int line, const char* format, ...) {
  std::fprintf(stderr, "%s:%d: ", file, line);
  va_list arguments;
  va_start(arguments, format);
  std::vfprintf(stderr, format, arguments);
  va_end(arguments);
  std::fputc('\n', stderr);
  std::abort();
}

}  // namespace hwy
