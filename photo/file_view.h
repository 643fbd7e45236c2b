#pragma once

#include <algorithm>
#include <concepts>
#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace pelorin::photo {

/// Bytes that are read when they are wanted. For one thread at a time.
class ByteSource {
 public:
  virtual ~ByteSource() = default;

  virtual std::uint64_t size() const = 0;

  /// Reads as many bytes as there is room for, which stand at `place` and all lie below `size()`.
  /// @throws what reading them throws, such as std::system_error.
  virtual void read(std::uint64_t place, std::span<std::uint8_t> bytes) = 0;
};

/// Bytes that are laid away to be read later.
class ByteStore : public ByteSource {
 public:
  /// @throws what writing them throws, such as std::system_error.
  virtual void append(std::span<const std::uint8_t> bytes) = 0;
};

/// A file: all of its bytes, or the first of them and where the others come from. Owns neither.
struct FileView {
  FileView() = default;
  template <typename Bytes>
  requires std::convertible_to<const Bytes&, std::span<const std::uint8_t>> FileView(
      const Bytes& all)
      : bytes(all) {}
  FileView(const std::uint8_t* all, std::size_t size) : bytes(all, size) {}
  FileView(std::span<const std::uint8_t> first, ByteSource* others) : bytes(first), rest(others) {}

  std::uint64_t size() const { return bytes.size() + (rest != nullptr ? rest->size() : 0); }

  std::span<const std::uint8_t> bytes;
  ByteSource* rest = nullptr;  ///< The bytes behind those; null for none.
};

/// Reads as many bytes of a file as there is room for, from `place` on.
inline void readFrom(const FileView& file, std::uint64_t place, std::span<std::uint8_t> bytes) {
  if (place < file.bytes.size()) {
    const std::span first = file.bytes.subspan(static_cast<std::size_t>(place));
    const std::size_t count = std::min(first.size(), bytes.size());
    std::copy_n(first.begin(), count, bytes.begin());
    bytes = bytes.subspan(count);
    place += count;
  }
  if (!bytes.empty()) file.rest->read(place - file.bytes.size(), bytes);
}

/// Calls `take` with all bytes of a source, a block at a time.
template <typename Take>
void forEachBlock(ByteSource& source, const Take& take) {
  constexpr std::uint64_t blockSize = std::uint64_t{1} << 18;
  std::vector<std::uint8_t> block;
  for (std::uint64_t place = 0; place < source.size(); place += block.size()) {
    block.resize(static_cast<std::size_t>(std::min(blockSize, source.size() - place)));
    source.read(place, block);
    take(std::span<const std::uint8_t>(block));
  }
}

/// All bytes of a file, in memory.
inline std::vector<std::uint8_t> wholeOf(const FileView& file) {
  std::vector<std::uint8_t> whole(static_cast<std::size_t>(file.size()));
  readFrom(file, 0, whole);
  return whole;
}

}  // namespace pelorin::photo
