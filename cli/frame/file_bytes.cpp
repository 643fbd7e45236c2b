#include "cli/frame/file_bytes.h"

#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <system_error>

#include "cli/frame/errors.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/limits.h"
#include "photo/backup.h"
#include "photo/format.h"

namespace pelorin::cli {
namespace {

[[noreturn]] void throwSystemError() {
  throw std::system_error(errno, std::generic_category());
}

void writeStream(std::FILE* stream, std::span<const std::uint8_t> bytes) {
  if (std::fwrite(bytes.data(), 1, bytes.size(), stream) != bytes.size()) throwSystemError();
  if (std::fflush(stream) != 0) throwSystemError();
}

photo::ReadOptions readOptions() {
  return {.largest = limits().decode.bytes, .wait = {.stop = interruptToken()}};
}

// Of every format that has one.
bool mayBePart(std::span<const std::uint8_t> first) {
  return std::ranges::any_of(photo::formats(), [&](const photo::Format& format) {
    return format.recognises(first) && format.mayBePart(first);
  });
}

}  // namespace

std::vector<std::uint8_t> readInput(const Input& input) {
  const photo::ReadOptions options = readOptions();
  return input.isStandardInput() ? photo::readDescriptor(STDIN_FILENO, input.path, options)
                                 : photo::readFile(input.path, options);
}

photo::OpenedFile openInput(const Input& input, const photo::OpenOptions& options) {
  if (input.isStandardInput() || options.raw) return {readInput(input)};
  return photo::openFile(input.path, readOptions(), mayBePart);
}

void writeOutput(const std::string& path, const photo::FileView& bytes,
                 const photo::ReplaceOptions& options, const std::string& backup) {
  try {
    if (path == "-") {
      writeStream(stdout, bytes.bytes);
      if (bytes.rest != nullptr)
        photo::forEachBlock(*bytes.rest, [](auto block) { writeStream(stdout, block); });
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
