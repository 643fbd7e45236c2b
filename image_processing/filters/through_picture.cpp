#include "image_processing/filters/through_picture.h"

#include <algorithm>
#include <utility>

namespace pelorin::image_processing {
namespace {

using MakeFilter =
    std::function<std::unique_ptr<AbstractFilter>(std::shared_ptr<FilteredImageState>&)>;

class ThroughPicture : public RowFilter {
 public:
  ThroughPicture(MakeFilter makeFilter, RowRequest request)
      : makeFilter_(std::move(makeFilter)), request_(std::move(request)) {}

  bool filter(RowSource& rows, RowSink& filtered, const RowWork& work) override {
    const auto picture = makeSharedImage<RGBA8Pixel>(request_.width, request_.height);
    const auto forEachBand = [&](auto visit) {
      for (std::uint32_t y = 0; y < request_.height; y += work.bandHeight) {
        if (shallStop(work)) return false;
        visit(picture->row(y), std::min(work.bandHeight, request_.height - y));
      }
      return true;
    };
    const auto collect = [&](RGBA8Pixel* to, std::uint32_t count) {
      const RGBA8Pixel* const from = rows.next(count, to);
      if (from != to) std::copy_n(from, std::size_t{request_.width} * count, to);
    };
    if (!forEachBand(collect)) return false;

    auto state = std::make_shared<FilteredImageState>(
        FilteredImageState{picture, request_.metadata, "", request_.config, work.workers});
    const std::unique_ptr<AbstractFilter> filter = makeFilter_(state);
    filter->init(request_.params);
    filter->applyConfig(request_.params, request_.config, *picture);
    return forEachBand([&](RGBA8Pixel* from, std::uint32_t count) { filtered.write(from, count); });
  }

 private:
  MakeFilter makeFilter_;
  RowRequest request_;
};

}  // namespace

std::unique_ptr<RowFilter> throughPicture(MakeFilter makeFilter, RowRequest request) {
  return std::make_unique<ThroughPicture>(std::move(makeFilter), std::move(request));
}

}  // namespace pelorin::image_processing
