#pragma once

#include <array>
#include <cstdint>
#include <optional>
#include <vector>

namespace pelorin::photo {

/// How many samples of brightness a JPEG file has to one of colour, each way: 1,1 is 4:4:4, 2,1 is
/// 4:2:2 and 2,2 is 4:2:0.
struct ChromaSampling {
  int across = 2, down = 2;

  friend bool operator==(const ChromaSampling&, const ChromaSampling&) = default;
};

/// How a JPEG file is coded, beside its picture.
struct JpegCoding {
  using QuantizationTable = std::array<std::uint16_t, 64>;

  bool progressive = false;
  bool grey = false;                            ///< One channel.
  std::optional<ChromaSampling> sampling = {};  ///< None where there is no colour, or oddly much.
  std::vector<QuantizationTable> tables = {};   ///< Of brightness, then of colour, as far as known.
};

/// The quality, 1 ... 100, whose usual tables come nearest to the file's; nothing without tables.
/// @throws PhotoError; std::bad_alloc.
std::optional<int> estimatedQuality(const JpegCoding& coding);

}  // namespace pelorin::photo
