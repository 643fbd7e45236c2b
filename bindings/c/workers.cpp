#include "bindings/c/workers.h"

#include <atomic>
#include <exception>
#include <mutex>

namespace pelorin::c_api {
namespace {

struct Tasks {
  const image_processing::Workers::Task& task;
  std::size_t count;
  std::atomic<std::size_t> begun = 0;
  std::mutex mutex = {};  // guards the error
  std::exception_ptr error = nullptr;
};

extern "C" void runOne(void* state, std::size_t index) {
  auto& tasks = *static_cast<Tasks*>(state);
  ++tasks.begun;
  try {
    if (index >= tasks.count) refuse("workers", "ran a task that there is not");
    tasks.task(index);
  } catch (...) {
    const std::lock_guard lock(tasks.mutex);
    if (tasks.error == nullptr) tasks.error = std::current_exception();
  }
}

}  // namespace

CallersWorkers::CallersWorkers(const quenby_workers& workers)
    : workers_(optionsOf(&workers, "workers")) {
  required(workers_.run, "workers: run");
  if (workers_.count < 1 || workers_.count > 1024) refuse("workers: count", "is not 1 to 1024");
}

void CallersWorkers::run(std::size_t count, const Task& task) {
  Tasks tasks{task, count};
  workers_.run(workers_.context, count, runOne, &tasks);
  const std::lock_guard lock(tasks.mutex);
  if (tasks.error != nullptr) std::rethrow_exception(tasks.error);
  if (tasks.begun != count) refuse("workers", "did not run every task once");
}

}  // namespace pelorin::c_api
