#include "cli/frame/file_bytes.h"

#include <poll.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <cstdio>
#include <filesystem>
#include <memory>
#include <system_error>

#include "cli/frame/errors.h"
#include "cli/frame/interrupt.h"
#include "photo/backup.h"

namespace fs = std::filesystem;

namespace pelorin::cli {
namespace {

[[noreturn]] void throwSystemError() {
  throw std::system_error(errno, std::generic_category());
}

std::vector<std::uint8_t> readStandardInput() {
  std::vector<std::uint8_t> bytes;
  std::array<std::uint8_t, 65536> block;
  for (;;) {
    // Ctrl-C may reach another thread than this one, so no wait is for ever.
    pollfd waiting = {STDIN_FILENO, POLLIN, 0};
    const int ready = poll(&waiting, 1, /*milliseconds=*/100);
    stopIfInterrupted();
    if (ready == 0) continue;
    const ssize_t count = read(STDIN_FILENO, block.data(), block.size());
    if (count < 0 && errno != EINTR) throwSystemError();
    if (count == 0) return bytes;
    if (count > 0) bytes.insert(bytes.end(), block.begin(), block.begin() + count);
  }
}

void writeStream(std::FILE* stream, std::span<const std::uint8_t> bytes) {
  if (std::fwrite(bytes.data(), 1, bytes.size(), stream) != bytes.size()) throwSystemError();
  if (std::fflush(stream) != 0) throwSystemError();
}

// Renaming a new file over a device would put an ordinary file in the place of it.
void writeSpecialFile(const std::string& path, std::span<const std::uint8_t> bytes) {
  const std::unique_ptr<std::FILE, int (*)(std::FILE*)> stream(std::fopen(path.c_str(), "wb"),
                                                               std::fclose);
  if (stream == nullptr) throwSystemError();
  writeStream(stream.get(), bytes);
}

}  // namespace

std::vector<std::uint8_t> readInput(const Input& input) {
  return input.isStandardInput() ? readStandardInput() : photo::readFile(input.path);
}

void writeOutput(const std::string& path, std::span<const std::uint8_t> bytes,
                 const photo::ReplaceOptions& options, const std::string& backup) {
  try {
    std::error_code ignored;
    if (path == "-") {
      writeStream(stdout, bytes);
    } else if (fs::is_other(fs::status(path, ignored))) {
      writeSpecialFile(path, bytes);
    } else {
      photo::Replacement replacement(path, bytes, options);
      if (!backup.empty()) photo::keepBackup(backup, path);
      replacement.replace();
    }
  } catch (const std::system_error& error) {
    throw FileError((path == "-" ? "standard output" : path) +
                    " cannot be written: " + explain(error));
  }
}

}  // namespace pelorin::cli
