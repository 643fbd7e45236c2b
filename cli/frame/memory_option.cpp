#include "cli/frame/memory_option.h"

#include <algorithm>

#include "cli/frame/jobs.h"

namespace pelorin::cli {
namespace {

std::uint64_t bytesOf(int mebibytes) {
  return std::uint64_t{static_cast<unsigned>(mebibytes)} << 20;
}

std::size_t atOnce(int jobs, std::size_t files) {
  return std::clamp<std::size_t>(files, 1, static_cast<std::size_t>(jobsAtOnce(jobs)));
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
    : each_(bytesOf(mebibytes) / atOnce(jobs, files)),
      budget_(bytesOf(mebibytes)),
      spares_(atOnce(jobs, files)) {
  free_.reserve(spares_.size());
  for (photo::SparePixels& spare : spares_) free_.push_back(&spare);
}

KeptPixels::Lent::Lent(KeptPixels& pixels) : pixels_(pixels) {
  const std::lock_guard lock(pixels_.mutex_);
  if (pixels_.free_.empty()) return;
  spare_ = pixels_.free_.back();
  pixels_.free_.pop_back();
}

KeptPixels::Lent::~Lent() {
  if (spare_ == nullptr) return;
  const std::lock_guard lock(pixels_.mutex_);
  pixels_.free_.push_back(spare_);  // for which there is room
}

photo::RowResources KeptPixels::Lent::resources() const {
  return {.pixels = pixels_.each_, .budget = &pixels_.budget_, .spare = spare_};
}

}  // namespace pelorin::cli
