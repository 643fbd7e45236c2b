#include "bindings/c/workers.h"

#include <algorithm>
#include <atomic>
#include <exception>
#include <mutex>

#include "image_processing/core/work_stopped.h"
#include "photo/thread_workers.h"

struct quenby_threads {
  explicit quenby_threads(std::size_t count) : workers(count) {}
  pelorin::photo::ThreadWorkers workers;
};

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

extern "C" void runOnThreads(void* context, std::size_t tasks,
                             void (*task)(void* state, std::size_t index), void* state) {
  try {
    static_cast<quenby_threads*>(context)->workers.run(
        tasks, [task, state](std::size_t index) { task(state, index); });
  } catch (...) {  // no memory to begin with; that tasks were left out, the caller will see
  }
}

// Of the call that this thread is in; the session's state has no place for it, since several threads may
// have filters of one session applied.
thread_local const std::stop_token* stopOfCall = nullptr;

constexpr std::size_t leastTasks = 16;  // of 12 megapixels each takes some milliseconds

}  // namespace

StoppableWorkers::Call::Call(const std::stop_token& stop) {
  stopOfCall = stop.stop_possible() ? &stop : nullptr;
}

StoppableWorkers::Call::~Call() {
  stopOfCall = nullptr;
}

std::size_t StoppableWorkers::count() const {
  const std::size_t count = image_processing::tasksFor(lent_);
  return stopOfCall == nullptr ? count : std::max(count, leastTasks);
}

void StoppableWorkers::run(std::size_t tasks, const Task& task) {
  const std::stop_token* const stop = stopOfCall;  // tasks have threads of their own
  if (stop == nullptr) return image_processing::runTasks(lent_, tasks, task);
  image_processing::runTasks(lent_, tasks, [&](std::size_t index) {
    if (stop->stop_requested()) throw image_processing::WorkStopped();
    task(index);
  });
}

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

using namespace pelorin::c_api;

int32_t quenby_threads_new(size_t count, quenby_threads** threads, quenby_error* error) {
  return guarded(error, [&] {
    required(threads, "threads") = nullptr;
    if (count > 1024) refuse("count", "is not 0 to 1024");
    *threads = new quenby_threads(count);
  });
}

int32_t quenby_threads_lend(quenby_threads* threads, quenby_workers* workers, quenby_error* error) {
  return guarded(error, [&] {
    required(threads, "threads");
    quenby_workers lent{};
    lent.count = threads->workers.count();
    lent.context = threads;
    lent.run = runOnThreads;
    give(workers, lent, "workers");
  });
}

void quenby_threads_free(quenby_threads* threads) {
  delete threads;
}
