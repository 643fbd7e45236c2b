#include "image_processing/filters/through_picture.h"

#include <algorithm>
#include <utility>

#include "image_processing/core/work_stopped.h"

namespace pelorin::image_processing {
namespace {

using MakeFilter =
    std::function<std::unique_ptr<AbstractFilter>(std::shared_ptr<FilteredImageState>&)>;

// That a filter divides its work into, to be asked between them.
constexpr std::size_t leastTasks = 16;

/// Workers that leave a filter's work where it is to be given up.
class AskingWorkers : public Workers {
 public:
  explicit AskingWorkers(const RowWork& work) : work_(work) {}

  std::size_t count() const override { return std::max(tasksFor(work_.workers), leastTasks); }

  void run(std::size_t tasks, const Task& task) override {
    runTasks(work_.workers, tasks, [&](std::size_t i) {
      if (shallStop(work_)) throw WorkStopped();
      task(i);
    });
  }

 private:
  const RowWork& work_;
};

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

    AskingWorkers asking(work);
    auto state = std::make_shared<FilteredImageState>(FilteredImageState{
        picture, request_.metadata, "", request_.config, work.stop ? &asking : work.workers});
    const std::unique_ptr<AbstractFilter> filter = makeFilter_(state);
    try {
      filter->init(request_.params);
      filter->applyConfig(request_.params, request_.config, *picture);
    } catch (const WorkStopped&) {
      return false;
    }
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
