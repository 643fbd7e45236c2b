#include <algorithm>

#include "image_processing/autoenhance/masks/flatness_mask.h"
#include "image_processing/autoenhance/masks/flatness_table.h"

namespace pelorin::image_processing {

template <typename TB, typename TL>
void computeFlatnessMask(const Image<float>& lightness, const Image<TB>& smoothed, int radius,
                         Image<TL>& mask) {
  if (lightness.pixelCount() == 0) return;
  if (radius < 0) {
    TL none;
    none = 0.0f;
    mask.set(none);
    return;
  }
  FlatnessTable table(mask.width, mask.height, radius);
  std::uint32_t y = 0;
  for (std::int64_t i = 0; i < table.height(); i += sumRowsAtOnce) {
    const std::int64_t end = std::min(i + sumRowsAtOnce, table.height());
    for (std::int64_t k = i; k < end; ++k) {
      const std::uint32_t source = table.sourceOf(k);
      table.weigh(k, lightness.row(source), smoothed.row(source));
    }
    table.sum(i);
    for (; y < table.shapedEnd(end); ++y) table.shape(y, mask.row(y));
  }
}

using Quantized = QuantizedFloat<unsigned char>;
template void computeFlatnessMask(const Image<float>&, const Image<float>&, int, Image<float>&);
template void computeFlatnessMask(const Image<float>&, const Image<Quantized>&, int,
                                  Image<Quantized>&);

}  // namespace pelorin::image_processing
