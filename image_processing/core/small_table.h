// Included after <hwy/foreach_target.h> and <hwy/highway.h>, once for each instruction set.
#if defined(PELORIN_CORE_SMALL_TABLE_H_) == defined(HWY_TARGET_TOGGLE)
#ifdef PELORIN_CORE_SMALL_TABLE_H_
#undef PELORIN_CORE_SMALL_TABLE_H_
#else
#define PELORIN_CORE_SMALL_TABLE_H_
#endif

#include <hwy/highway.h>

HWY_BEFORE_NAMESPACE();
namespace pelorin::image_processing::HWY_NAMESPACE {
namespace simd {
namespace hn = hwy::HWY_NAMESPACE;

/// A table of 64 floats, read lane by lane: from registers where two of them can be permuted at
/// once, else from memory. Vectors have at most 16 lanes.
class SmallTable {
  using Floats = hn::CappedTag<float, 16>;
  using Ints = hn::RebindToSigned<Floats>;

 public:
  /// @param samples  outlive the table.
  HWY_INLINE explicit SmallTable(const float* samples)
#if HWY_TARGET <= HWY_AVX3
      : first_(hn::LoadU(Floats(), samples)),
        second_(hn::LoadU(Floats(), samples + 16)),
        third_(hn::LoadU(Floats(), samples + 32)),
        fourth_(hn::LoadU(Floats(), samples + 48)) {
  }

  /// The samples at indices from 0 to 63.
  HWY_INLINE hn::Vec<Floats> operator()(hn::Vec<Ints> index) const {
    const hn::Vec<Floats> low{_mm512_permutex2var_ps(first_.raw, index.raw, second_.raw)};
    const hn::Vec<Floats> high{_mm512_permutex2var_ps(third_.raw, index.raw, fourth_.raw)};
    const auto isHigh = hn::TestBit(index, hn::Set(Ints(), 32));
    return hn::IfThenElse(hn::RebindMask(Floats(), isHigh), high, low);
  }

 private:
  hn::Vec<Floats> first_, second_, third_, fourth_;
#else
      : samples_(samples) {
  }

  HWY_INLINE hn::Vec<Floats> operator()(hn::Vec<Ints> index) const {
    return hn::GatherIndex(Floats(), samples_, index);
  }

 private:
  const float* samples_;
#endif
};

}  // namespace simd
}  // namespace pelorin::image_processing::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
#endif  // per-target include guard
