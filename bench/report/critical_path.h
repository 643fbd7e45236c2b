#pragma once

#include <cstddef>
#include <functional>

#include "image_processing/core/workers.h"

namespace pelorin::bench {

/// Workers of which there is one, that works out how long several would have taken: the processor
/// time of each task is given to the one of them that is free first. What a machine whose cores have
/// other work cannot show by the clock.
class CriticalPath : public image_processing::Workers {
 public:
  explicit CriticalPath(std::size_t count) : count_(count) {}

  std::size_t count() const override { return count_; }
  void run(std::size_t tasks, const Task& task) override;

  /// Seconds that `work` would take, if it gives these workers all tasks and does the rest alone.
  double secondsOf(const std::function<void()>& work);

 private:
  std::size_t count_;
  double saved_ = 0;  // of the seconds since `secondsOf` began
};

}  // namespace pelorin::bench
