#pragma once

#include <map>
#include <memory>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "photo/descriptor.h"
#include "photo/file_io.h"
#include "photo/file_view.h"

namespace pelorin::photo {

/// What stands behind the beginning of a file on a disk. It is read as often as it is asked for, and must
/// stay what it is meanwhile.
class LongFile : public ByteSource {
 public:
  /// @param file  open, at least `begin` bytes long.
  LongFile(Descriptor file, std::string path, std::uint64_t begin, std::stop_token stop = {});

  std::uint64_t size() const override { return size_; }

  /// @throws PhotoError when the file is not what it was, at the latest when it is read to its end once
  ///         more; std::system_error; Stopped.
  void read(std::uint64_t place, std::span<std::uint8_t> bytes) override;

 private:
  void checkUnchanged() const;

  const Descriptor file_;
  const std::string path_;
  const std::uint64_t begin_;
  std::uint64_t size_;
  timespec changed_;
  std::stop_token stop_;
  // Of what was read at a place: what is read there again must be the same.
  std::map<std::pair<std::uint64_t, std::size_t>, std::size_t> sums_;
};

/// An unnamed temporary that takes bytes, once there are any; gone with this.
class TemporaryStore : public ByteStore {
 public:
  /// @param folder  "" is the current one.
  explicit TemporaryStore(std::string folder) : folder_(std::move(folder)) {}

  std::uint64_t size() const override { return size_; }
  void read(std::uint64_t place, std::span<std::uint8_t> bytes) override;
  void append(std::span<const std::uint8_t> bytes) override;

 private:
  const std::string folder_;
  std::unique_ptr<Descriptor> file_;  // null while there are no bytes
  std::uint64_t size_ = 0;
};

/// The bytes of a file, as far as they are in memory.
struct OpenedFile {
  std::vector<std::uint8_t> bytes;
  std::unique_ptr<LongFile> rest = nullptr;  ///< Null when all are.

  FileView view() const { return {bytes, rest.get()}; }
};

/// Reads a file as `readFile`, but of one above 8 MiB on a disk no more than the beginning.
/// @param mayBePart  asked whether those first bytes are enough to begin with; else all are read.
/// @throws as `readFile`.
OpenedFile openFile(const std::string& path, const ReadOptions& options,
                    bool (*mayBePart)(std::span<const std::uint8_t> first));

}  // namespace pelorin::photo
