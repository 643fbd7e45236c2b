#include "image_processing/core/stages.h"

#include <vector>

namespace pelorin::image_processing {
namespace {

struct StageTask {
  const Stage* stage;
  std::int64_t band;
  std::size_t task;
};

}  // namespace

bool runStages(std::int64_t bands, std::initializer_list<Stage> stages, Workers* workers,
               const std::function<bool()>& stop) {
  const auto last = static_cast<std::int64_t>(stages.size()) - 1;
  // Bands between a stage and the next one.
  const std::int64_t lag = bandsUnderWay(2, workers) - 1;
  std::vector<StageTask> now;
  for (std::int64_t step = 0; bands > 0 && step < bands + last * lag; ++step) {
    if (stop && stop()) return false;
    now.clear();
    // At once, those that cannot be shared begin first; else in their order.
    for (const bool alone : {true, false}) {
      std::int64_t band = step;
      for (const Stage& stage : stages) {
        if (band >= 0 && band < bands && (lag > 0 && stage.tasks == 1) == alone) {
          for (std::size_t i = 0; i < stage.tasks; ++i) now.push_back({&stage, band, i});
        }
        band -= lag;
      }
    }
    runTasks(lag > 0 ? workers : nullptr, now.size(),
             [&](std::size_t i) { now[i].stage->work(now[i].band, now[i].task); });
  }
  return true;
}

}  // namespace pelorin::image_processing
