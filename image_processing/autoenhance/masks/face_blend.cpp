#include "image_processing/autoenhance/masks/face_blend.h"

#include <optional>

#include "image_processing/autoenhance/colour/lab.h"
#include "image_processing/autoenhance/masks/face_region.h"

namespace pelorin::image_processing {

template <typename TL>
void blendFaceIntoMask(const BoundingBox& face, const Image<RGBA8Pixel>& photo, Image<TL>& mask) {
  const std::optional<FaceRegion> region = faceRegion(face, photo.width, photo.height);
  if (!region) return;
  const std::vector<float> windowY = region->rows.weights();
  const std::vector<float> windowX = region->columns.weights();
  const ColourTables& tables = colourTables();
  for (std::int64_t y = region->rows.first; y <= region->rows.last; ++y) {
    const RGBA8Pixel* const pixels = photo.row(static_cast<std::uint32_t>(y));
    TL* const out = mask.row(static_cast<std::uint32_t>(y));
    const float atY = windowY[static_cast<std::size_t>(y - region->rows.first)];
    for (std::int64_t x = region->columns.first; x <= region->columns.last; ++x) {
      const Lab lab = rgbToLab(tables, pixels[x].r, pixels[x].g, pixels[x].b);
      const float skin = tables.skinA(lab.a) * tables.skinB(lab.b);
      const float atX = windowX[static_cast<std::size_t>(x - region->columns.first)];
      const float weight = atX * atY * skin;
      out[x] = 0.5f * weight + (1.0f - weight) * static_cast<float>(out[x]);
    }
  }
}

template void blendFaceIntoMask(const BoundingBox&, const Image<RGBA8Pixel>&, Image<float>&);
template void blendFaceIntoMask(const BoundingBox&, const Image<RGBA8Pixel>&,
                                Image<QuantizedFloat<unsigned char>>&);

}  // namespace pelorin::image_processing
