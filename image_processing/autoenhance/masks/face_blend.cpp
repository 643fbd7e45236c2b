#include "image_processing/autoenhance/masks/face_blend.h"

#include <algorithm>

#include "image_processing/autoenhance/colour/lab.h"

namespace pelorin::image_processing {
namespace {

struct Range {
  std::int64_t first, last;
};

/// From one side length before the centre of [low, high] to one after it, within [0, size - 1].
Range grown(std::int64_t low, std::int64_t high, std::int64_t size) {
  const std::int64_t centre = (low + high) / 2;
  const std::int64_t length = high - low;
  return {std::clamp<std::int64_t>(centre - length, 0, size - 1),
          std::clamp<std::int64_t>(centre + length, 0, size - 1)};
}

SuperQuadric windowOver(const Range& range) {
  return SuperQuadric(static_cast<float>(range.first), static_cast<float>(range.last), 1024, 2.0f);
}

}  // namespace

template <typename TL>
void blendFaceIntoMask(const BoundingBox& face, const Image<RGBA8Pixel>& photo, Image<TL>& mask) {
  if (photo.pixelCount() == 0) return;
  const Range rows = grown(face.top, face.bottom, photo.height);
  const Range columns = grown(face.left, face.right, photo.width);
  if (rows.first >= rows.last || columns.first >= columns.last) return;

  const SuperQuadric windowY = windowOver(rows);
  const SuperQuadric windowX = windowOver(columns);
  const ColourTables& tables = colourTables();
  for (std::int64_t y = rows.first; y <= rows.last; ++y) {
    const RGBA8Pixel* const pixels = photo.row(static_cast<std::uint32_t>(y));
    TL* const out = mask.row(static_cast<std::uint32_t>(y));
    const float atY = windowY(static_cast<float>(y));
    for (std::int64_t x = columns.first; x <= columns.last; ++x) {
      const Lab lab = rgbToLab(tables, pixels[x].r, pixels[x].g, pixels[x].b);
      const float skin = tables.skinA(lab.a) * tables.skinB(lab.b);
      const float weight = windowX(static_cast<float>(x)) * atY * skin;
      out[x] = 0.5f * weight + (1.0f - weight) * static_cast<float>(out[x]);
    }
  }
}

template void blendFaceIntoMask(const BoundingBox&, const Image<RGBA8Pixel>&, Image<float>&);
template void blendFaceIntoMask(const BoundingBox&, const Image<RGBA8Pixel>&,
                                Image<QuantizedFloat<unsigned char>>&);

}  // namespace pelorin::image_processing
