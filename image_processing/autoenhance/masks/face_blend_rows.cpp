#include "image_processing/autoenhance/masks/face_blend_rows.h"

#include <algorithm>
#include <map>
#include <numeric>
#include <optional>
#include <utility>

#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/masks/face_region.h"

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
  std::stable_sort(starts_.begin(), starts_.end(), [&](std::uint32_t a, std::uint32_t b) {
    return regions_[a].region.rows->first < regions_[b].region.rows->first;
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
  findSkin(pixels, scratch);
  const std::vector<SkinPixel>& skin = scratch.skin_;
  for (const std::uint32_t i : active) {
    const Window& rows = *regions_[i].region.rows;
    const Window& columns = *regions_[i].region.columns;
    const float atY = rows.weights[static_cast<std::size_t>(y - rows.first)];
    auto pixel = std::lower_bound(skin.begin(), skin.end(), columns.first,
                                  [](const SkinPixel& s, std::int64_t x) { return s.x < x; });
    for (; pixel != skin.end() && pixel->x <= columns.last; ++pixel) {
      const float atX = columns.weights[static_cast<std::size_t>(pixel->x - columns.first)];
      const float weight = atX * atY * pixel->skin;
      TL& out = mask[pixel->x];
      for (std::uint64_t time = 0; time < regions_[i].times; ++time) {
        const float before = out;
        out = 0.5f * weight + (1.0f - weight) * before;
        if (static_cast<float>(out) == before) break;
      }
    }
  }
}

// Pixels that are no skin at all have the weight 0 for every face, which changes no mask.
void FaceBlendRows::findSkin(const RGBA8Pixel* pixels, Scratch& scratch) const {
  const std::vector<std::uint32_t>& active = scratch.active_;
  std::int64_t first = regions_[active.front()].region.columns->first, last = first;
  for (const std::uint32_t i : active) {
    first = std::min(first, regions_[i].region.columns->first);
    last = std::max(last, regions_[i].region.columns->last);
  }
  const ColourTables& tables = colourTables();
  scratch.skin_.clear();
  for (std::int64_t x = first; x <= last; ++x) {
    const Lab lab = rgbToLab(tables, pixels[x].r, pixels[x].g, pixels[x].b);
    const float skin = tables.skinA(lab.a) * tables.skinB(lab.b);
    if (skin != 0.0f) scratch.skin_.push_back({static_cast<std::uint32_t>(x), skin});
  }
}

template void FaceBlendRows::blendRow(std::uint32_t, const RGBA8Pixel*, float*, Scratch&) const;
template void FaceBlendRows::blendRow(std::uint32_t, const RGBA8Pixel*,
                                      QuantizedFloat<unsigned char>*, Scratch&) const;

}  // namespace pelorin::image_processing
