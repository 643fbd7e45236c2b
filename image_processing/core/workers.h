#pragma once

#include <cstddef>
#include <cstdint>
#include <functional>

namespace pelorin::image_processing {

/// Threads that a caller lends for the work on a picture: the engine starts none of its own. What
/// comes out is the same, to the byte, for any number of them.
class Workers {
 public:
  using Task = std::function<void(std::size_t)>;

  virtual ~Workers() = default;

  /// How many tasks can be at work at the same time, on the calling thread and others; at least 1.
  virtual std::size_t count() const = 0;

  /// Calls `task(0)` ... `task(tasks - 1)`, each once and on any thread, and returns when all have
  /// ended. Those that take longest come first, and none waits for another: one thread is enough.
  /// @throws what a task threw, of one of them if it was several; tasks that had not begun by then
  ///         may be left out.
  /// Any thread may call it, several at once as well; tasks do not.
  virtual void run(std::size_t tasks, const Task& task) = 0;
};

/// How many tasks to make of work that can be divided as one likes; 1 without workers.
inline std::size_t tasksFor(const Workers* workers) {
  return workers == nullptr ? 1 : workers->count();
}

/// Runs tasks on `workers`, or one after the other where there are none.
inline void runTasks(Workers* workers, std::size_t tasks, const Workers::Task& task) {
  if (workers != nullptr && tasks > 1) return workers->run(tasks, task);
  for (std::size_t i = 0; i < tasks; ++i) task(i);
}

/// Where part `i` of `parts` begins when `total` things are divided evenly; for `i` = `parts` the end.
inline std::uint64_t partStart(std::uint64_t total, std::size_t i, std::size_t parts) {
  return total / parts * i + total % parts * i / parts;
}

}  // namespace pelorin::image_processing
