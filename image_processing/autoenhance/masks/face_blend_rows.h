#pragma once

#include <cstdint>
#include <memory>
#include <vector>

#include "image_processing/core/image_metadata.h"
#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

/// Draws all faces of a photo into its LTM mask, a row at a time, each into what the one before
/// left: `blendFaceIntoMask` for one after the other gives the same bytes. A row's skin is looked
/// for once however many faces cross it, and faces that cover the same part of the photo cost
/// little beyond the first. Any thread may use it.
class FaceBlendRows {
  // Columns from `first` to before `end`.
  struct Run {
    std::int64_t first, end;
  };

 public:
  /// What a thread works with: the faces that its latest row crossed.
  class Scratch {
    friend FaceBlendRows;

    std::size_t nextStart_ = 0;          // the first in `starts_` that the rows have not come to
    std::vector<std::uint32_t> active_;  // their numbers, in the order of the faces
    std::vector<float> skin_;            // of the row's pixels, where a face is
    std::vector<Run> runs_;              // that hold all of its skin, from left to right
  };

  /// Boxes may reach out of the photo; null ones are none. @throws std::bad_alloc.
  FaceBlendRows(const ImageMetadata& metadata, std::uint32_t width, std::uint32_t height);

  /// Blends row `y`, which is below those that `scratch` served before.
  /// @param pixels  the photo's, `width` of them.
  /// @param mask    read and written, likewise.
  /// May throw std::bad_alloc. For float and QuantizedFloat<unsigned char>.
  template <typename TL>
  void blendRow(std::uint32_t y, const RGBA8Pixel* pixels, TL* mask, Scratch& scratch) const;

 private:
  // A face's weights over the rows or the columns of its region, from `first` to `last`.
  struct Window {
    std::int64_t first, last;
    std::vector<float> weights;
  };
  using SharedWindow = std::shared_ptr<const Window>;
  struct Region {
    SharedWindow rows, columns;
  };
  // Regions that follow one another and are the same.
  struct Repeated {
    Region region;
    std::uint64_t times;
  };

  void findRuns(const RGBA8Pixel* pixels, Scratch& scratch) const;

  std::vector<Repeated> regions_;      // in the order of the faces
  std::vector<std::uint32_t> starts_;  // their numbers by first row
};

}  // namespace pelorin::image_processing
