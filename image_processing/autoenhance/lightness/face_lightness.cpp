#include "image_processing/autoenhance/lightness/face_lightness.h"

#include <algorithm>

#include "image_processing/autoenhance/colour/companding_steps.h"
#include "image_processing/autoenhance/lightness/cdf.h"

namespace pelorin::image_processing {

FaceLightness::FaceLightness(const ImageMetadata& metadata, std::uint32_t width,
                             std::uint32_t height, int bins, float scale)
    : histogram_(bins, scale) {
  for (const auto& box : metadata.faces) {
    if (box == nullptr) continue;
    const std::int64_t left = std::max<std::int64_t>(box->left, 0);
    const std::int64_t end = std::min<std::int64_t>(box->right, std::int64_t{width} - 1) + 1;
    const std::int64_t top = std::max<std::int64_t>(box->top, 0);
    const std::int64_t below = std::min<std::int64_t>(box->bottom, std::int64_t{height} - 1) + 1;
    if (left >= end || top >= below) continue;
    const auto first = static_cast<std::uint32_t>(left), last = static_cast<std::uint32_t>(end);
    edges_.push_back({top, first, last, +1});
    edges_.push_back({below, first, last, -1});
  }
  if (edges_.empty()) return;
  std::sort(edges_.begin(), edges_.end(), [](const Edge& a, const Edge& b) { return a.y < b.y; });
  changes_.resize(std::size_t{width} + 1);
  steps_.resize(width);
}

void FaceLightness::addRow(std::uint32_t y, const RGBA8Pixel* pixels) {
  bool changed = false;
  for (; nextEdge_ < edges_.size() && edges_[nextEdge_].y <= y; ++nextEdge_) {
    const Edge& edge = edges_[nextEdge_];
    changes_[edge.left] += edge.change;
    changes_[edge.end] -= edge.change;
    changed = true;
  }
  if (changed) findRuns();
  if (runs_.empty()) return;
  const std::uint32_t first = runs_.front().first;
  compandingSteps(pixels + first, steps_.data(), runs_.back().first + runs_.back().count - first);
  for (const Run& run : runs_) {
    histogram_.add(steps_.data() + (run.first - first), run.count, run.boxes);
  }
}

void FaceLightness::findRuns() {
  runs_.clear();
  std::int64_t boxes = 0;
  const auto width = static_cast<std::uint32_t>(changes_.size() - 1);
  for (std::uint32_t x = 0; x < width; ++x) {
    boxes += changes_[x];
    if (boxes == 0) continue;
    if (changes_[x] != 0 || runs_.empty()) {
      runs_.push_back({x, 0, static_cast<std::uint64_t>(boxes)});
    }
    ++runs_.back().count;
  }
}

std::int32_t FaceLightness::medianBin() const {
  if (histogram_.empty()) return -1;
  std::vector<float> cdf;
  computeCDF(histogram_.normalised(), cdf);
  const std::size_t bins = cdf.size() - 1;
  std::size_t i = 0;
  while (i < bins && cdf[i] < 0.5f) ++i;
  return i == bins ? -1 : static_cast<std::int32_t>(i);
}

}  // namespace pelorin::image_processing
