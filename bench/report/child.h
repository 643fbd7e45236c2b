#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

namespace pelorin::bench {

/// What some work took.
struct Spent {
  double seconds = 0;  ///< Of the processor: other work on the machine counts for little.
  std::uint64_t peakBytes = 0;
};

/// Calls `work` in a process of its own, so that its memory is new and its peak its own.
/// @returns what `work` returned. Ends this process when the child fails.
Spent inChild(const std::function<Spent()>& work);

/// Runs a command from its start to its end, its standard output going nowhere; its peak is that of
/// the whole process.
/// @param arguments  the program's path first.
/// Ends this process when the command fails.
Spent runCommand(const std::vector<std::string>& arguments);

/// Peak memory of this process so far.
std::uint64_t peakBytesOfThisProcess();

/// Seconds of the processor that `work` takes in this process.
double secondsOf(const std::function<void()>& work);

}  // namespace pelorin::bench
