#include "cli/frame/memory_option.h"

#include <algorithm>

#include "cli/frame/jobs.h"

namespace pelorin::cli {
namespace {

std::uint64_t bytesOf(int mebibytes) {
  return std::uint64_t{static_cast<unsigned>(mebibytes)} << 20;
}

}  // namespace

void addMemoryOption(Verb verb, int& mebibytes) {
  verb.option("--memory", mebibytes,
              "MiB for decoded pixels, 128 unless given, shared by the files at once; photos that "
              "need more are decoded again, or wait until they alone are kept where that cannot be")
      .between(0, 1 << 20)
      .type("MIB")
      .group("Reporting");
}

KeptPixels::KeptPixels(int mebibytes, int jobs, std::size_t files)
    : each_(bytesOf(mebibytes) / std::clamp<std::size_t>(files, 1, jobsAtOnce(jobs))),
      budget_(bytesOf(mebibytes)) {}

photo::RowResources KeptPixels::resources() {
  thread_local photo::SparePixels spare;
  return {.pixels = each_, .budget = &budget_, .spare = &spare};
}

}  // namespace pelorin::cli
