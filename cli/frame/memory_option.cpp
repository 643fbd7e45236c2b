#include "cli/frame/memory_option.h"

#include <algorithm>

#include "cli/frame/jobs.h"

namespace pelorin::cli {
namespace {

// A photo of 3 megapixels, or one of 12 that is halved: decoding all of it again would cost as much as
// the rest of its way. Larger ones take a tenth more time and a third of the memory.
constexpr int worthKeeping = 12;

std::uint64_t bytesOf(int mebibytes) {
  return std::uint64_t{static_cast<unsigned>(mebibytes)} << 20;
}

std::size_t filesAtOnce(int jobs, std::size_t files) {
  return std::clamp<std::size_t>(files, 1, jobsAtOnce(jobs));
}

}  // namespace

void addMemoryOption(Verb verb, int& mebibytes) {
  verb.option(
          "--memory", mebibytes,
          mebibytes == thriftyMemory
              ? "MiB for decoded pixels, shared by the files at once; photos that need more are "
                "decoded again, or wait until they alone are kept where that cannot be. Unless "
                "given, 128, and photos that need not be kept are decoded again above 12"
              : "MiB for decoded pixels, 128 unless given, shared by the files at once; photos "
                "that need more are decoded again, or wait until they alone are kept where that "
                "cannot be")
      .between(0, 1 << 20)
      .type("MIB")
      .group("Reporting");
}

KeptPixels::KeptPixels(int mebibytes, int jobs, std::size_t files)
    : each_(bytesOf(mebibytes == thriftyMemory ? worthKeeping : mebibytes) /
            filesAtOnce(jobs, files)),
      spared_(bytesOf(mebibytes == thriftyMemory ? usualMemory : mebibytes) /
              filesAtOnce(jobs, files)),
      budget_(bytesOf(mebibytes == thriftyMemory ? usualMemory : mebibytes)) {}

photo::RowResources KeptPixels::resources() {
  thread_local photo::SparePixels spare;
  return {.pixels = each_, .budget = &budget_, .spare = &spare, .spared = spared_};
}

}  // namespace pelorin::cli
