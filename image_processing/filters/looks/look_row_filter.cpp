#include "image_processing/filters/looks/look_row_filter.h"

#include <utility>

#include "image_processing/filters/looks/look_rows.h"
#include "image_processing/filters/mapped_rows.h"

namespace pelorin::image_processing {
namespace {

class LookRowFilter : public RowFilter {
 public:
  LookRowFilter(Look look, std::unique_ptr<CubicRadialMask> vignette, std::uint32_t width,
                std::uint32_t height)
      : vignette_(std::move(vignette)),
        look_(std::move(look)),
        rows_(look_, width, height),
        width_(width),
        height_(height) {}

  bool filter(RowSource& rows, RowSink& filtered, const RowWork& work) override {
    return mapRows(width_, height_, rows, filtered, work,
                   [this](std::uint32_t y, const RGBA8Pixel* from, RGBA8Pixel* to,
                          std::size_t count) -> const RGBA8Pixel* {
                     rows_.apply(y, from, to, count);
                     return to;
                   });
  }

 private:
  std::unique_ptr<CubicRadialMask> vignette_;
  Look look_;
  LookRows rows_;
  std::uint32_t width_, height_;
};

}  // namespace

std::unique_ptr<RowFilter> lookRowFilter(Look look, std::unique_ptr<CubicRadialMask> vignette,
                                         std::uint32_t width, std::uint32_t height) {
  return std::make_unique<LookRowFilter>(std::move(look), std::move(vignette), width, height);
}

}  // namespace pelorin::image_processing
