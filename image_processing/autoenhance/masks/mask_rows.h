#pragma once

#include <cstdint>
#include <functional>
#include <optional>

#include "image_processing/autoenhance/lightness/lightness_row.h"
#include "image_processing/autoenhance/masks/face_blend_rows.h"
#include "image_processing/autoenhance/masks/flatness_table.h"
#include "image_processing/autoenhance/masks/grid.h"
#include "image_processing/autoenhance/masks/grid_slice.h"
#include "image_processing/autoenhance/masks/row_ring.h"
#include "image_processing/core/image_metadata.h"
#include "image_processing/filters/filter_config.h"

namespace pelorin::image_processing {

/// The two masks of a photo, made from the top in steps of some rows, of its splat and blurred grid.
/// A step is prepared, then summed, then its rows are finished; sums go step after step, all else
/// needs no order and may run on several threads, each with a scratch of its own. So neither the photo, nor
/// its lightness, nor a mask has to exist as a whole.
///
/// For (float, float) and (QuantizedFloat<unsigned char>, the same).
template <typename TB, typename TL>
class MaskRows {
 public:
  /// The pixels of a row of the photo; any thread asks.
  using PhotoRow = std::function<const RGBA8Pixel*(std::uint32_t y)>;

  /// @param grid         of a photo of `width` x `height`, at least one pixel; held on to, as `photo`.
  /// @param bilateral    where the smoothing goes; holds `rowsHeld` rows at least, or all of them.
  /// @param stepsAtOnce  how many steps may be prepared before the first of them is finished.
  /// @throws std::bad_alloc.
  MaskRows(const Grid& grid, float cellSize, std::uint32_t width, std::uint32_t height,
           const FilterConfig& config, const ImageMetadata& metadata, PhotoRow photo,
           RowRing<TB> bilateral, int stepsAtOnce = 1);

  /// Rows of the photo and of the smoothing that are in use at a time.
  static std::uint32_t rowsHeld(std::uint32_t height, const FilterConfig& config,
                                int stepsAtOnce = 1);

  std::int64_t steps() const;

  /// The rows of the photo that step `i` and those before it need are those below this.
  std::uint32_t photoEnd(std::int64_t step) const;

  /// The rows of the masks that are finished with step `i` and those before it are those below this.
  std::uint32_t maskEnd(std::int64_t step) const;

  /// What a thread prepares with.
  class Scratch {
   public:
    /// @throws std::bad_alloc.
    explicit Scratch(const MaskRows& rows)
        : lightness(rows.width_), slicer(rows.grid_, rows.width_, rows.cellSize_) {}
    LightnessRow lightness;
    GridSlicer slicer;
  };

  /// Smooths the rows of a step, and weighs them. Never throws, as the next.
  void prepare(std::int64_t step, Scratch& scratch);

  /// Sums what is prepared: after the step before it.
  void sum(std::int64_t step, LightnessRow& scratch);

  const TB* bilateral(std::uint32_t y) const { return bilateral_.row(y); }

  /// Writes the LTM mask of row `y`, once its step is summed; `scratch` served no row below before.
  /// May throw std::bad_alloc where there are faces.
  void writeLtm(std::uint32_t y, TL* mask, FaceBlendRows::Scratch& scratch) const;

 private:
  /// Of the smoothing.
  const TB* smooth(std::uint32_t y, const float* lightness, Scratch& scratch);
  template <typename Visit>
  void forEachTableRow(std::int64_t step, bool first, Visit visit) const;

  const Grid& grid_;
  float cellSize_;
  std::uint32_t width_, height_;
  PhotoRow photo_;
  RowRing<TB> bilateral_;
  std::optional<FlatnessTable> table_;  // none: the mask is 0 but for the faces
  FaceBlendRows faces_;
};

}  // namespace pelorin::image_processing
