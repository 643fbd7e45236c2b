#include "cli/frame/file_bytes.h"

#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <system_error>

#include "cli/frame/errors.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/limits.h"
#include "photo/backup.h"

namespace pelorin::cli {
namespace {

[[noreturn]] void throwSystemError() {
  throw std::system_error(errno, std::generic_category());
}

void writeStream(std::FILE* stream, std::span<const std::uint8_t> bytes) {
  if (std::fwrite(bytes.data(), 1, bytes.size(), stream) != bytes.size()) throwSystemError();
  if (std::fflush(stream) != 0) throwSystemError();
}

}  // namespace

std::vector<std::uint8_t> readInput(const Input& input) {
  const photo::ReadOptions options = {.largest = limits().bytes,
                                      .wait = {.stop = interruptToken()}};
  return input.isStandardInput() ? photo::readDescriptor(STDIN_FILENO, input.path, options)
                                 : photo::readFile(input.path, options);
}

void writeOutput(const std::string& path, std::span<const std::uint8_t> bytes,
                 const photo::ReplaceOptions& options, const std::string& backup) {
  try {
    if (path == "-") {
      writeStream(stdout, bytes);
      return;
    }
    photo::ReplaceOptions replace = options;
    replace.wait.stop = interruptToken();
    photo::Replacement replacement(path, bytes, replace);
    if (!backup.empty()) {
      photo::keepBackup(backup, path);
      photo::recordResult(backup, path, bytes);
    }
    replacement.replace();
  } catch (const Interrupted&) {
    throw;
  } catch (const photo::PhotoError& error) {
    throw FileError(path + " cannot be written: " + explain(error));
  } catch (const std::system_error& error) {
    throw FileError((path == "-" ? "standard output" : path) +
                    " cannot be written: " + explain(error));
  }
}

}  // namespace pelorin::cli
