#include "image_processing/quality/niqe_grey.h"

#undef HWY_TARGET_INCLUDE
#define HWY_TARGET_INCLUDE "image_processing/quality/niqe_grey_simd.cpp"
#include <hwy/foreach_target.h>  // compiles the rest of this file once per instruction set
#include <hwy/highway.h>

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace {
#if HWY_TARGET == HWY_SCALAR
void niqeGrey(const RGBA8Pixel* pixels, float* grey, std::size_t count) {
  niqeGreyScalar(pixels, grey, count);
}
#else
namespace hn = hwy::HWY_NAMESPACE;
using Floats = hn::ScalableTag<float>;
using Ints = hn::RebindToSigned<Floats>;
using Words = hn::RebindToUnsigned<Floats>;
using Bytes = hn::Repartition<std::uint8_t, Floats>;

void niqeGrey(const RGBA8Pixel* pixels, float* grey, std::size_t count) {
  const Floats floats;
  const Ints ints;
  const std::size_t lanes = hn::Lanes(floats);
  const auto lowByte = hn::Set(Words(), 0xFFu);
  const auto toFloats = [&](auto channel) {
    return hn::ConvertTo(floats, hn::BitCast(ints, hn::And(channel, lowByte)));
  };
  std::size_t i = 0;
  for (; i + lanes <= count; i += lanes) {
    // Every supported target is little-endian: red is the lowest byte of a pixel's word.
    const auto words = hn::BitCast(Words(), hn::LoadU(Bytes(), &pixels[i].r));
    const auto r = toFloats(words);
    const auto g = toFloats(hn::ShiftRight<8>(words));
    const auto b = toFloats(hn::ShiftRight<16>(words));
    auto sum =
        hn::Add(hn::Mul(g, hn::Set(floats, niqeGreen)), hn::Mul(r, hn::Set(floats, niqeRed)));
    sum = hn::Add(sum, hn::Mul(b, hn::Set(floats, niqeBlue)));
    hn::StoreU(sum, floats, grey + i);
  }
  niqeGreyScalar(pixels + i, grey + i, count - i);
}
#endif
}  // namespace
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#if HWY_ONCE
namespace pelorin::image_processing {
HWY_EXPORT(niqeGrey);
void niqeGrey(const RGBA8Pixel* pixels, float* grey, std::size_t count) {
  HWY_DYNAMIC_DISPATCH(niqeGrey)(pixels, grey, count);
}
}  // namespace pelorin::image_processing
#endif
