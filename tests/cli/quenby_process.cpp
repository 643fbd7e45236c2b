#include "tests/cli/quenby_process.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>

namespace pelorin::test_support {
namespace {

Finished runWithInput(const std::vector<std::string>& command, const Bytes& input) {
  const TemporaryFolder folder;
  const int standardInput = open(folder.write("input", input).c_str(), O_RDONLY | O_CLOEXEC);
  Finished finished = Process(command, standardInput).wait();
  close(standardInput);
  return finished;
}

}  // namespace

Process::Process(const std::vector<std::string>& command, int standardInput) {
  std::vector<char*> arguments;
  for (const std::string& argument : command) {
    arguments.push_back(const_cast<char*>(argument.c_str()));
  }
  arguments.push_back(nullptr);
  const std::string output = folder_ / "output", errors = folder_ / "errors";
  id_ = fork();
  if (id_ < 0) throw std::runtime_error("fork");
  if (id_ > 0) return;
  const int flags = O_WRONLY | O_CREAT | O_TRUNC;
  dup2(standardInput, STDIN_FILENO);
  dup2(open(output.c_str(), flags, 0600), STDOUT_FILENO);
  dup2(open(errors.c_str(), flags, 0600), STDERR_FILENO);
  execv(arguments[0], arguments.data());
  _exit(127);
}

Process::~Process() {
  if (id_ < 0) return;
  kill(id_, SIGKILL);
  waitpid(id_, nullptr, 0);
}

void Process::send(int signal) {
  kill(id_, signal);
}

Finished Process::wait() {
  int status = 0;
  waitpid(id_, &status, 0);
  id_ = -1;
  const int code = WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
  return {code, textOf(folder_.read("output")), textOf(folder_.read("errors"))};
}

std::string quenbyPath() {
  const char* const other = std::getenv("QUENBY_COMMAND");
  return other != nullptr ? other : QUENBY_COMMAND;
}

Finished quenby(const std::vector<std::string>& arguments, const Bytes& input) {
  std::vector<std::string> command = {quenbyPath()};
  command.insert(command.end(), arguments.begin(), arguments.end());
  return runWithInput(command, input);
}

Finished shell(const std::string& command) {
  return runWithInput({"/bin/sh", "-c", "QUENBY='" + quenbyPath() + "'; " + command}, {});
}

}  // namespace pelorin::test_support
