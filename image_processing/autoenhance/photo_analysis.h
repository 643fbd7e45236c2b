#pragma once

#include <cstdint>
#include <functional>
#include <optional>

#include "image_processing/autoenhance/lightness/face_lightness.h"
#include "image_processing/autoenhance/lightness/image_statistics.h"
#include "image_processing/autoenhance/lightness/lightness_histogram.h"
#include "image_processing/autoenhance/lightness/lightness_row.h"
#include "image_processing/autoenhance/masks/grid.h"
#include "image_processing/autoenhance/masks/grid_splat.h"
#include "image_processing/core/image.h"
#include "image_processing/core/image_metadata.h"
#include "image_processing/core/pixel_types.h"
#include "image_processing/core/rows.h"
#include "image_processing/core/workers.h"
#include "image_processing/filters/row_filter.h"

namespace pelorin::image_processing {

/// A photo that is to be looked at, and where to.
struct AnalysisSubject {
  std::uint32_t width, height;
  const ImageMetadata& metadata;
  Grid* grid = nullptr;  ///< Empty and over the photo, for its splat; null for none.
  float cellSize = 1.0f;
};

/// All that auto-enhance must know of a photo before its first pixel, found a row at a time: the
/// statistics and the splat. For one thread; several may share the work, each with one of these and
/// no row of the grid with another.
class PhotoAnalysis {
 public:
  /// Holds on to what the subject refers to. @throws std::bad_alloc.
  explicit PhotoAnalysis(const AnalysisSubject& subject);

  /// Looks at row `y`, which is below those before. @throws std::bad_alloc.
  void addRow(std::uint32_t y, const RGBA8Pixel* pixels);

  /// Takes over what another one has found in other rows. Never throws.
  void add(const PhotoAnalysis& other);

  /// Of the rows so far. @throws std::bad_alloc.
  ImageStatistics statistics() const { return analyzeImage(counter_, faces_); }

 private:
  std::uint32_t width_;
  LightnessRow lightness_;
  LightnessHistogramSimd counter_;
  FaceLightness faces_;
  std::optional<GridSplatter> splatter_;
};

/// Looks at all rows of a photo in memory.
/// @param stop  asked every `bandHeight` rows, by any thread, whether to give up; may be empty.
/// @returns nothing when it gave up; the grid is then useless.
/// @throws std::bad_alloc.
std::optional<ImageStatistics> analysePhoto(const AnalysisSubject& subject,
                                            const RGBA8Pixel* pixels, Workers* workers,
                                            std::uint32_t bandHeight = 16,
                                            const std::function<bool()>& stop = {});

/// Looks at all rows of a photo, at those that come one by one while the next ones do.
/// @returns nothing when it gave up as `work.stop` said; the grid is then useless.
/// @throws what the source throws; std::bad_alloc.
std::optional<ImageStatistics> analysePhoto(const AnalysisSubject& subject, RowSource& rows,
                                            const RowWork& work);

/// The statistics of a photo in memory. @throws std::bad_alloc.
ImageStatistics analysePhoto(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                             Workers* workers);

}  // namespace pelorin::image_processing
