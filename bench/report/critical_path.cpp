#include "bench/report/critical_path.h"

#include <algorithm>
#include <vector>

#include "bench/report/child.h"

namespace pelorin::bench {

void CriticalPath::run(std::size_t tasks, const Task& task) {
  std::vector<double> busy(count_);
  double all = 0;
  for (std::size_t i = 0; i < tasks; ++i) {
    const double seconds = bench::secondsOf([&] { task(i); });
    *std::min_element(busy.begin(), busy.end()) += seconds;
    all += seconds;
  }
  saved_ += all - *std::max_element(busy.begin(), busy.end());
}

double CriticalPath::secondsOf(const std::function<void()>& work) {
  saved_ = 0;
  return bench::secondsOf(work) - saved_;
}

}  // namespace pelorin::bench
