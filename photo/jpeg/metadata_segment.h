#pragma once

#include <cstdint>
#include <vector>

namespace pelorin::photo {

/// One APPn or COM segment: `marker` 0xE0 ... 0xEF or 0xFE, `payload` what follows its length.
/// Metadata longer than a segment (large profiles, extended XMP) comes as several of them.
struct MetadataSegment {
  std::uint8_t marker;
  std::vector<std::uint8_t> payload;

  friend bool operator==(const MetadataSegment&, const MetadataSegment&) = default;
};

}  // namespace pelorin::photo
