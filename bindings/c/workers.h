#pragma once

#include <cstddef>
#include <stop_token>

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

/// Workers of a session, which leave the work of a call that is cancelled: before each of its tasks,
/// of which a call that can be cancelled has some dozen even on one thread.
class StoppableWorkers : public image_processing::Workers {
 public:
  /// Makes what the calling thread has done while it lives one call, to end with WorkStopped when
  /// `stop` says so.
  class Call {
   public:
    explicit Call(const std::stop_token& stop);
    ~Call();
    Call(const Call&) = delete;
    Call& operator=(const Call&) = delete;
  };

  /// @param workers  outlive this one; null for none.
  void lend(image_processing::Workers* workers) { lent_ = workers; }

  std::size_t count() const override;
  void run(std::size_t tasks, const Task& task) override;

 private:
  image_processing::Workers* lent_ = nullptr;
};

}  // namespace pelorin::c_api
