#include "image_processing/autoenhance/masks/face_blend_row.h"

#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

template <typename T>
void blendFaceRowScalar(const float* columns, float row, const float* skin, std::uint64_t times,
                        T* mask, std::size_t count) {
  for (std::size_t i = 0; i < count; ++i) {
    const float weight = columns[i] * row * skin[i];
    for (std::uint64_t time = 0; time < times; ++time) {
      const float before = mask[i];
      mask[i] = 0.5f * weight + (1.0f - weight) * before;
      if (static_cast<float>(mask[i]) == before) break;
    }
  }
}

template void blendFaceRowScalar(const float*, float, const float*, std::uint64_t, float*,
                                 std::size_t);
template void blendFaceRowScalar(const float*, float, const float*, std::uint64_t,
                                 QuantizedFloat<unsigned char>*, std::size_t);

}  // namespace pelorin::image_processing
