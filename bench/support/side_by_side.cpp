#include "bench/support/side_by_side.h"

#include <hwy/highway.h>

#include <algorithm>
#include <chrono>
#include <cstring>
#include <map>
#include <string>
#include <vector>

namespace pelorin::bench {
namespace {

struct InstructionSet {
  const char* name;
  std::int64_t targets;
};

// The sets the machine has, the best last. Each comes with those it contains, since not every
// kernel is built for each.
std::vector<InstructionSet> instructionSets() {
  const std::int64_t all = hwy::SupportedTargets();
  std::vector<InstructionSet> sets;
  if ((all & HWY_SSE4) != 0) sets.push_back({"SSE4", all & -HWY_SSE4});
  if ((all & HWY_AVX2) != 0) sets.push_back({"AVX2", all & -HWY_AVX2});
  if ((all & HWY_AVX3) != 0) sets.push_back({"AVX512", all});
  if (sets.empty()) sets.push_back({"fast", all});
  return sets;
}

double nanoseconds(const std::function<void()>& run) {
  const auto start = std::chrono::steady_clock::now();
  run();
  benchmark::ClobberMemory();
  return std::chrono::duration<double, std::nano>(std::chrono::steady_clock::now() - start).count();
}

double median(std::vector<double>& times) {
  const auto middle = times.begin() + times.size() / 2;
  std::nth_element(times.begin(), middle, times.end());
  return *middle;
}

}  // namespace

void sideBySide(benchmark::State& state, std::uint64_t pixels, const void* picture,
                std::size_t bytes, const std::function<void()>& scalar,
                const std::function<void()>& fast) {
  static const std::vector<InstructionSet> sets = instructionSets();
  std::vector<unsigned char> copy(bytes);
  std::map<std::string, std::vector<double>> times;
  fast();
  for (auto _ : state) {
    times["copy"].push_back(nanoseconds([&] { std::memcpy(copy.data(), picture, bytes); }));
    if (scalar) times["scalar"].push_back(nanoseconds(scalar));
    for (const InstructionSet& set : sets) {
      hwy::SetSupportedTargetsForTest(set.targets);
      times[set.name].push_back(nanoseconds(fast));
    }
    hwy::SetSupportedTargetsForTest(0);
    state.SetIterationTime(times[sets.back().name].back() * 1e-9);
  }
  for (auto& [name, taken] : times) state.counters[name] = median(taken) / pixels;
  state.counters["per_copy"] =
      state.counters[sets.back().name].value / state.counters["copy"].value;
}

}  // namespace pelorin::bench
