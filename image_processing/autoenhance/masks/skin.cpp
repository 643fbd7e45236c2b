#include "image_processing/autoenhance/masks/skin.h"

#include "image_processing/autoenhance/colour/lab.h"

namespace pelorin::image_processing {

void findSkinScalar(const RGBA8Pixel* pixels, float* skin, std::size_t count) {
  const ColourTables& tables = colourTables();
  for (std::size_t i = 0; i < count; ++i) {
    const Lab lab = rgbToLab(tables, pixels[i].r, pixels[i].g, pixels[i].b);
    skin[i] = tables.skinA(lab.a) * tables.skinB(lab.b);
  }
}

}  // namespace pelorin::image_processing
