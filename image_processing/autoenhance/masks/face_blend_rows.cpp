#include "image_processing/autoenhance/masks/face_blend_rows.h"

#include <algorithm>
#include <map>
#include <numeric>
#include <optional>
#include <utility>

#include "image_processing/autoenhance/masks/face_blend_row.h"
#include "image_processing/autoenhance/masks/face_region.h"
#include "image_processing/autoenhance/masks/skin.h"

namespace pelorin::image_processing {

FaceBlendRows::FaceBlendRows(const ImageMetadata& metadata, std::uint32_t width,
                             std::uint32_t height) {
  std::map<std::pair<std::int64_t, std::int64_t>, SharedWindow> windows;
  const auto windowOver = [&](const FaceSide& side) {
    SharedWindow& window = windows[{side.first, side.last}];
    if (window == nullptr)
      window = std::make_shared<Window>(Window{side.first, side.last, side.weights()});
    return window;
  };
  for (const auto& face : metadata.faces) {
    if (face == nullptr) continue;
    const std::optional<FaceRegion> region = faceRegion(*face, width, height);
    if (!region) continue;
    const Region next = {windowOver(region->rows), windowOver(region->columns)};
    const bool again = !regions_.empty() && regions_.back().region.rows == next.rows &&
                       regions_.back().region.columns == next.columns;
    if (!again) regions_.push_back({next, 0});
    ++regions_.back().times;
  }
  starts_.resize(regions_.size());
  std::iota(starts_.begin(), starts_.end(), std::uint32_t{0});
  std::sort(starts_.begin(), starts_.end(), [&](std::uint32_t a, std::uint32_t b) {
    const std::int64_t first = regions_[a].region.rows->first,
                       other = regions_[b].region.rows->first;
    return first != other ? first < other : a < b;
  });
}

template <typename TL>
void FaceBlendRows::blendRow(std::uint32_t y, const RGBA8Pixel* pixels, TL* mask,
                             Scratch& scratch) const {
  std::vector<std::uint32_t>& active = scratch.active_;
  const auto isOver = [&](std::uint32_t i) { return regions_[i].region.rows->last < y; };
  std::erase_if(active, isOver);
  for (; scratch.nextStart_ < starts_.size(); ++scratch.nextStart_) {
    const std::uint32_t region = starts_[scratch.nextStart_];
    if (regions_[region].region.rows->first > y) break;
    if (isOver(region)) continue;
    active.insert(std::upper_bound(active.begin(), active.end(), region), region);
  }
  if (active.empty()) return;
  findRuns(pixels, scratch);
  const std::vector<Run>& runs = scratch.runs_;
  for (const std::uint32_t i : active) {
    const Window& rows = *regions_[i].region.rows;
    const Window& columns = *regions_[i].region.columns;
    const float atY = rows.weights[static_cast<std::size_t>(y - rows.first)];
    auto run = std::lower_bound(runs.begin(), runs.end(), columns.first,
                                [](const Run& r, std::int64_t x) { return r.end <= x; });
    for (; run != runs.end() && run->first <= columns.last; ++run) {
      const std::int64_t first = std::max(run->first, columns.first);
      const std::int64_t end = std::min(run->end, columns.last + 1);
      blendFaceRow(columns.weights.data() + (first - columns.first), atY,
                   scratch.skin_.data() + first, regions_[i].times, mask + first,
                   static_cast<std::size_t>(end - first));
    }
  }
}

// Pixels that are no skin at all have the weight 0 for every face, which changes no mask.
void FaceBlendRows::findRuns(const RGBA8Pixel* pixels, Scratch& scratch) const {
  const std::vector<std::uint32_t>& active = scratch.active_;
  std::int64_t first = regions_[active.front()].region.columns->first, last = first;
  for (const std::uint32_t i : active) {
    first = std::min(first, regions_[i].region.columns->first);
    last = std::max(last, regions_[i].region.columns->last);
  }
  std::vector<float>& skin = scratch.skin_;
  skin.resize(std::max(skin.size(), static_cast<std::size_t>(last + 1)));
  findSkin(pixels + first, skin.data() + first, static_cast<std::size_t>(last + 1 - first));
  constexpr std::int64_t gap = 32;  // pixels without skin that a run rather takes than ends at
  scratch.runs_.clear();
  for (std::int64_t x = first; x <= last; ++x) {
    if (skin[static_cast<std::size_t>(x)] == 0.0f) continue;
    if (scratch.runs_.empty() || x - scratch.runs_.back().end > gap)
      scratch.runs_.push_back({x, x});
    scratch.runs_.back().end = x + 1;
  }
}

template void FaceBlendRows::blendRow(std::uint32_t, const RGBA8Pixel*, float*, Scratch&) const;
template void FaceBlendRows::blendRow(std::uint32_t, const RGBA8Pixel*,
                                      QuantizedFloat<unsigned char>*, Scratch&) const;

}  // namespace pelorin::image_processing
