#pragma once

#include <cstdint>
#include <span>
#include <vector>

namespace pelorin::photo {

/// Whether the payload of an APP2 segment is an index of the Multi-Picture Format (CIPA DC-007).
bool isMpf(std::span<const std::uint8_t> payload);

/// What an index says of one of its pictures.
struct MpfEntry {
  std::uint32_t attributes;  ///< Kind of picture, format and flags.
  std::uint32_t size;        ///< Of its file, in bytes.
  std::uint32_t offset;      ///< From the index's TIFF header; 0 of the first.
};

/// The entries of an index; none when it cannot be read. Any bytes are safe.
std::vector<MpfEntry> readMpf(std::span<const std::uint8_t> payload);

/// An index of these pictures, the payload of an APP2 segment; its length depends on their number
/// alone.
std::vector<std::uint8_t> writeMpf(std::span<const MpfEntry> entries);

/// Where in a payload the TIFF header stands from which offsets count.
constexpr std::size_t mpfHeaderPlace = 4;

constexpr std::uint32_t mpfPrimary = 0x030000;  ///< Attributes of a primary picture in JPEG.
constexpr std::uint32_t mpfUndefined = 0;       ///< And of one of no kind that is defined.

}  // namespace pelorin::photo
