#pragma once

#include <hwy/targets.h>

#include <cstdint>
#include <vector>

namespace pelorin::bench {

/// An instruction set that the tables have a column for.
struct InstructionSet {
  const char* name;
  std::int64_t targets;  ///< Highway's, this one and what is below it.
};

/// Of AVX2 and AVX-512 those that this machine has; where it has neither, what it has.
inline std::vector<InstructionSet> instructionSets() {
  const std::int64_t supported = hwy::SupportedTargets();
  constexpr std::int64_t aboveAvx2 = HWY_AVX2 - 1;  // Highway's better sets are its lower bits
  std::vector<InstructionSet> sets;
  if ((supported & HWY_AVX2) != 0) sets.push_back({"AVX2", supported & ~aboveAvx2});
  if ((supported & HWY_AVX3) != 0) sets.push_back({"AVX-512", supported});
  if (sets.empty()) sets.push_back({"vectors", supported});
  return sets;
}

}  // namespace pelorin::bench
