#pragma once

#include <cstdint>
#include <span>
#include <vector>

namespace pelorin::photo {

/// One entry of a TIFF directory.
struct TiffEntry {
  std::uint16_t tag, type;
  std::uint32_t count;
  std::uint64_t place;       ///< Of the entry's twelve bytes.
  std::uint64_t valuePlace;  ///< Of its value, in the entry or elsewhere; lies within the file.
  std::uint64_t valueSize;   ///< In bytes.
};

/// A directory of a TIFF file.
struct TiffDirectory {
  std::vector<TiffEntry> entries;    ///< Those whose type is known and whose value is in the file.
  std::uint64_t begin = 0, end = 0;  ///< Of its bytes; both 0 when there is no such directory.
  std::uint64_t linkPlace = 0;       ///< Where the place of the next one stands; 0 when cut off.

  /// The first entry with this tag; null without one.
  const TiffEntry* find(std::uint16_t tag) const;
};

/// A TIFF file in memory that is not its own. Offsets are 64 bits wide and compared with the file's
/// end; what lies beyond it is not there.
class Tiff {
 public:
  /// Any bytes are safe; those that do not begin as TIFF does have no directories.
  explicit Tiff(std::span<const std::uint8_t> bytes);

  bool valid() const { return valid_; }
  bool littleEndian() const { return littleEndian_; }
  std::uint64_t size() const { return bytes_.size(); }
  bool holds(std::uint64_t place, std::uint64_t size) const {
    return place <= bytes_.size() && size <= bytes_.size() - place;
  }

  /// Of places that the file holds.
  std::uint16_t read16(std::uint64_t place) const;
  std::uint32_t read32(std::uint64_t place) const;

  /// The directory at this place; an empty one where there is none. One that is cut off has the
  /// entries that are whole.
  TiffDirectory directoryAt(std::uint64_t place) const;
  TiffDirectory firstDirectory() const;
  /// The one that a directory's link leads to.
  TiffDirectory nextDirectory(const TiffDirectory& directory) const;
  /// The one whose place an entry of type LONG or IFD tells.
  TiffDirectory directoryOf(const TiffEntry* entry) const;

  /// Whether the entry holds at least one SHORT or LONG.
  static bool isNumber(const TiffEntry& entry);
  /// The number at `index` of an entry that `isNumber`; `index` below its count.
  std::uint32_t number(const TiffEntry& entry, std::uint32_t index = 0) const;

 private:
  std::span<const std::uint8_t> bytes_;
  bool littleEndian_ = false, valid_ = false;
};

/// One that is patched in place. What was read of it before stays as it was read.
class EditableTiff : public Tiff {
 public:
  explicit EditableTiff(std::span<std::uint8_t> bytes) : Tiff(bytes), bytes_(bytes) {}

  std::span<std::uint8_t> bytes() const { return bytes_; }

  /// At places that the file holds.
  void write16(std::uint64_t place, std::uint16_t value);
  void write32(std::uint64_t place, std::uint32_t value);
  /// @returns false, and writes nothing, when a SHORT cannot hold the value.
  bool setNumber(const TiffEntry& entry, std::uint32_t value, std::uint32_t index = 0);

 private:
  std::span<std::uint8_t> bytes_;
};

}  // namespace pelorin::photo
