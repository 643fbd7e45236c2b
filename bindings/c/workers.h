#pragma once

#include "bindings/c/boundary.h"
#include "image_processing/core/workers.h"

namespace pelorin::c_api {

/// Workers of a caller in C. Errors of tasks do not cross what the caller runs them with.
class CallersWorkers : public image_processing::Workers {
 public:
  /// @throws std::invalid_argument when they cannot be.
  explicit CallersWorkers(const quenby_workers& workers);

  std::size_t count() const override { return workers_.count; }
  /// @throws std::invalid_argument also when tasks were left out or run twice.
  void run(std::size_t tasks, const Task& task) override;

 private:
  quenby_workers workers_;
};

}  // namespace pelorin::c_api
