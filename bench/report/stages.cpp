#include "bench/report/stages.h"

#include <fmt/format.h>

#include <cstring>
#include <functional>
#include <vector>

#include "bench/report/child.h"
#include "bench/support/instruction_sets.h"
#include "bench/support/median.h"
#include "bench/support/per_pixel.h"
#include "tests/kernels/kernels.h"

namespace pelorin::bench {
namespace {

using image_processing::Image;
using image_processing::RGBA8Pixel;

/// Nanoseconds a pixel: the median of `fewest` to nine runs, as many as take 0.3 seconds.
double timeOf(const std::function<void()>& run, std::size_t fewest) {
  constexpr double enough = 0.3;
  std::vector<double> seconds;
  double sum = 0;
  while (seconds.size() < fewest || (sum < enough && seconds.size() < 9)) {
    seconds.push_back(secondsOf(run));
    sum += seconds.back();
  }
  return median(seconds) / static_cast<double>(twelveMegapixels().pixelCount()) * 1e9;
}

}  // namespace

std::string stagesTable() {
  const Image<RGBA8Pixel>& photo = twelveMegapixels();
  const std::vector<InstructionSet> sets = instructionSets();
  std::string header = "| Nanoseconds a pixel | definition |", rule = "|---|---:|";
  for (const InstructionSet& set : sets) {
    header += fmt::format(" {} |", set.name);
    rule += "---:|";
  }
  std::string table = header + " definition / best |\n" + rule + "---:|\n";

  for (const test_support::KernelRow& row : test_support::kernelRows()) {
    const test_support::Kernel kernel = row.on(photo);
    kernel.vectors();  // makes tables, and touches new memory
    std::string variants;
    double best = 0;
    for (const InstructionSet& set : sets) {
      hwy::SetSupportedTargetsForTest(set.targets);
      best = timeOf(kernel.vectors, 3);
      variants += fmt::format(" {:.2f} |", best);
    }
    hwy::SetSupportedTargetsForTest(0);
    if (kernel.definition) {
      const double plain = timeOf(kernel.definition, 1);
      table += fmt::format("| {} | {:.2f} |{} {:.1f} |\n", row.name, plain, variants, plain / best);
    } else {
      table += fmt::format("| {} | |{} |\n", row.name, variants);
    }
  }
  const Image<RGBA8Pixel> copy(photo.width, photo.height);
  const auto copyPhoto = [&] { std::memcpy(copy.data.get(), photo.data.get(), photo.byteSize()); };
  copyPhoto();
  const double copying = timeOf(copyPhoto, 3);
  return table + fmt::format("| copy of the picture | {:.2f} |{}\n", copying,
                             std::string(sets.size() + 1, '|'));
}

}  // namespace pelorin::bench
