#include "bench/support/side_by_side.h"

#include <chrono>
#include <cstring>
#include <map>
#include <string>
#include <vector>

#include "bench/support/instruction_sets.h"
#include "bench/support/median.h"

namespace pelorin::bench {
namespace {

double nanoseconds(const std::function<void()>& run) {
  const auto start = std::chrono::steady_clock::now();
  run();
  benchmark::ClobberMemory();
  return std::chrono::duration<double, std::nano>(std::chrono::steady_clock::now() - start).count();
}

}  // namespace

void sideBySide(benchmark::State& state, std::uint64_t pixels, const void* picture,
                std::size_t bytes, const std::function<void()>& scalar,
                const std::function<void()>& variant) {
  static const std::vector<InstructionSet> sets = instructionSets();
  std::vector<unsigned char> copy(bytes);
  std::map<std::string, std::vector<double>> times;
  variant();
  for (auto _ : state) {
    times["copy"].push_back(nanoseconds([&] { std::memcpy(copy.data(), picture, bytes); }));
    if (scalar) times["scalar"].push_back(nanoseconds(scalar));
    for (const InstructionSet& set : sets) {
      hwy::SetSupportedTargetsForTest(set.targets);
      times[set.name].push_back(nanoseconds(variant));
    }
    hwy::SetSupportedTargetsForTest(0);
    state.SetIterationTime(times[sets.back().name].back() * 1e-9);
  }
  for (auto& [name, taken] : times) state.counters[name] = median(taken) / pixels;
  state.counters["per_copy"] =
      state.counters[sets.back().name].value / state.counters["copy"].value;
}

}  // namespace pelorin::bench
