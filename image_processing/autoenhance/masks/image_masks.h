#pragma once

#include <memory>

#include "image_processing/autoenhance/lightness/image_statistics.h"
#include "image_processing/core/image.h"
#include "image_processing/core/image_metadata.h"
#include "image_processing/core/workers.h"
#include "image_processing/filters/filter_config.h"

namespace pelorin::image_processing {

/// The two masks of one photo, each of the photo's size with values in [0, 1]. Copies share them. A
/// caller may fill a record by hand.
template <typename TB, typename TL>
struct ImageMasks {
  std::shared_ptr<Image<TB>> bilateralMask;  ///< Lightness / 100, smoothed with its edges kept.
  std::shared_ptr<Image<TL>> ltmMask;        ///< Local flatness, drawn toward 0.5 on faces' skin.
  /// The LTM mask whose pixels, and those of the bilateral mask beside it, were allocated and never
  /// written. Who writes them afterwards empties this.
  std::shared_ptr<const Image<TL>> unwritten = nullptr;

  /// Whether there are masks to read.
  bool present() const {
    return bilateralMask != nullptr && ltmMask != nullptr && ltmMask != unwritten;
  }
};

/// Allocates both masks, whatever the record held, and writes no pixel: they are not `present`.
/// @throws std::bad_alloc.
///
/// Keeps no state. For (float, float) and (QuantizedFloat<unsigned char>, the same), as the next.
template <typename TB, typename TL>
void allocateImageMasks(const Image<RGBA8Pixel>& photo, ImageMasks<TB, TL>& masks);

/// Makes both masks new, whatever the record held. With `detailGainHigh` 0 they are allocated and
/// not computed.
/// @throws std::bad_alloc; no masks are present then.
template <typename TB, typename TL>
void computeImageMasks(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                       const FilterConfig& config, ImageMasks<TB, TL>& masks);

/// `analyzeImage` and `computeImageMasks` in one: the photo's lightness is found once for both.
/// @param workers  share the work; null for none.
/// @throws std::bad_alloc; the statistics may be there all the same.
template <typename TB, typename TL>
void prepareImage(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                  const FilterConfig& config, ImageStatistics& statistics,
                  ImageMasks<TB, TL>& masks, Workers* workers = nullptr);

/// Computes both masks through the grid and the photo's statistics on the way. Two passes over the
/// photo: neither its lightness nor the table of sums ever exists as a whole.
/// @param photo           of at least one pixel.
/// @param bilateral, ltm  written; of the photo's size.
/// @param workers         share the work; null for none.
/// @throws std::bad_alloc.
template <typename TB, typename TL>
ImageStatistics computeMasksByGrid(const Image<RGBA8Pixel>& photo, const ImageMetadata& metadata,
                                   const FilterConfig& config, Image<TB>& bilateral, Image<TL>& ltm,
                                   Workers* workers = nullptr);

/// Fills the LTM mask: flatness when `amount` is above 0, else 0, then the faces one by one, each
/// blending into what the one before left.
/// @param lightness  of the photo / 100; of the photo's size, as all images here.
/// @param bilateral  the smoothing of `lightness`.
/// @param radius     half-size of the flatness window, at least 0.
/// @param mask       written.
template <typename TB, typename TL>
void computeLtmMask(const ImageMetadata& metadata, const Image<RGBA8Pixel>& photo,
                    const Image<float>& lightness, const Image<TB>& bilateral, float amount,
                    int radius, Image<TL>& mask);

}  // namespace pelorin::image_processing
