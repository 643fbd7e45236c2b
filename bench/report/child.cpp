#include "bench/report/child.h"

#include <fcntl.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <ctime>

namespace pelorin::bench {
namespace {

[[noreturn]] void fail(const char* what) {
  std::fprintf(stderr, "performance_report: %s\n", what);
  std::exit(1);
}

std::uint64_t peakOf(const rusage& usage) {
  return static_cast<std::uint64_t>(usage.ru_maxrss) * 1024;
}

double secondsIn(const timeval& time) {
  return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) * 1e-6;
}

double processorSeconds() {
  timespec time{};
  clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
  return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) * 1e-9;
}

}  // namespace

Spent inChild(const std::function<Spent()>& work) {
  int ends[2];
  if (pipe(ends) != 0) fail("no pipe");
  std::fflush(nullptr);
  const pid_t child = fork();
  if (child == 0) {
    const Spent spent = work();
    std::_Exit(write(ends[1], &spent, sizeof spent) == sizeof spent ? 0 : 1);
  }
  close(ends[1]);
  Spent spent;
  const bool whole = read(ends[0], &spent, sizeof spent) == sizeof spent;
  close(ends[0]);
  int status = 1;
  if (child < 0 || waitpid(child, &status, 0) != child || status != 0 || !whole) {
    fail("a measured child failed");
  }
  return spent;
}

Spent runCommand(const std::vector<std::string>& arguments) {
  std::vector<char*> pointers;  // posix_spawn only reads
  for (const std::string& argument : arguments) {
    pointers.push_back(const_cast<char*>(argument.c_str()));
  }
  pointers.push_back(nullptr);
  char* const environment[] = {nullptr};
  posix_spawn_file_actions_t actions;
  posix_spawn_file_actions_init(&actions);
  posix_spawn_file_actions_addopen(&actions, STDOUT_FILENO, "/dev/null", O_WRONLY, 0);
  pid_t child;
  int status = 1;
  rusage usage{};
  if (posix_spawn(&child, pointers[0], &actions, nullptr, pointers.data(), environment) != 0 ||
      wait4(child, &status, 0, &usage) != child || status != 0) {
    fail("a measured command failed");
  }
  posix_spawn_file_actions_destroy(&actions);
  return {secondsIn(usage.ru_utime) + secondsIn(usage.ru_stime), peakOf(usage)};
}

std::uint64_t peakBytesOfThisProcess() {
  rusage usage{};
  getrusage(RUSAGE_SELF, &usage);
  return peakOf(usage);
}

double secondsOf(const std::function<void()>& work) {
  const double start = processorSeconds();
  work();
  return processorSeconds() - start;
}

}  // namespace pelorin::bench
