#include "image_processing/dupe/packed_cdf.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <cstddef>
#include <cstring>
#include <optional>

#include "image_processing/core/float_counter.h"

namespace pelorin::image_processing {
namespace {

using Counts = std::array<std::uint32_t, std::tuple_size_v<GreenCDF>>;

// Packed: the number of pixels, then for every block of counts the bits of its largest, then the counts.
constexpr std::size_t blockSize = 16;
constexpr std::size_t blocks = std::tuple_size_v<Counts> / blockSize;
constexpr std::size_t headerSize = sizeof(std::uint32_t) + blocks;
// A count, of at most 25 bits, is read as part of four bytes, also where the last are of none.
constexpr std::size_t readBeyond = 4;
constexpr std::uint32_t largestCount = std::uint32_t{1} << 24;
// The size tells whether a distribution is packed.
static_assert(headerSize + sizeof(Counts) * 25 / 32 + readBeyond < sizeof(GreenCDF));

GreenCDF cdfOf(const Counts& counts, std::uint32_t pixelCount) {
  std::array<float, std::tuple_size_v<Counts>> histogram;
  std::transform(counts.begin(), counts.end(), histogram.begin(), asFloatCounter);
  GreenCDF cdf;
  computeCDFFromCounts(histogram, asFloatCounter(pixelCount), cdf);
  return cdf;
}

bool isSame(const GreenCDF& a, const GreenCDF& b) {
  return std::memcmp(a.data(), b.data(), sizeof a) == 0;  // -0 is not 0, NaN is NaN
}

/// The counts that `cdf` is made of, if it is.
std::optional<Counts> countsOf(const GreenCDF& cdf, std::uint32_t pixelCount) {
  Counts counts;
  double before = 0.0;
  for (std::size_t i = 0; i < counts.size(); ++i) {
    const double count = std::round((double{cdf[i]} - before) * pixelCount);
    if (!(count >= 0.0 && count <= largestCount)) return std::nullopt;
    counts[i] = static_cast<std::uint32_t>(count);
    before = double{cdf[i]};
  }
  if (!isSame(cdfOf(counts, pixelCount), cdf)) return std::nullopt;
  return counts;
}

std::vector<std::uint8_t> packed(const Counts& counts, std::uint32_t pixelCount) {
  std::array<std::uint8_t, blocks> widths;
  std::size_t bits = 0;
  for (std::size_t block = 0; block < blocks; ++block) {
    const auto first = counts.begin() + block * blockSize;
    widths[block] =
        static_cast<std::uint8_t>(std::bit_width(*std::max_element(first, first + blockSize)));
    bits += widths[block] * blockSize;
  }
  std::vector<std::uint8_t> bytes(headerSize + bits / 8 + readBeyond);  // a block fills whole bytes
  std::memcpy(bytes.data(), &pixelCount, sizeof pixelCount);
  std::copy(widths.begin(), widths.end(), bytes.begin() + sizeof pixelCount);
  std::uint8_t* next = bytes.data() + headerSize;
  std::uint64_t held = 0;  // bits that are not written, the first the lowest
  int count = 0;
  for (std::size_t i = 0; i < counts.size(); ++i) {
    held |= std::uint64_t{counts[i]} << count;
    for (count += widths[i / blockSize]; count >= 8; count -= 8, held >>= 8) {
      *next++ = static_cast<std::uint8_t>(held & 0xFF);
    }
  }
  return bytes;
}

/// The four bytes from `bytes` on, the first the lowest.
std::uint32_t fourBytes(const std::uint8_t* bytes) {
  return bytes[0] | std::uint32_t{bytes[1]} << 8 | std::uint32_t{bytes[2]} << 16 |
         std::uint32_t{bytes[3]} << 24;
}

GreenCDF unpackedCounts(const std::vector<std::uint8_t>& bytes) {
  std::uint32_t pixelCount;
  std::memcpy(&pixelCount, bytes.data(), sizeof pixelCount);
  const std::uint8_t* block = bytes.data() + headerSize;
  Counts counts;
  for (std::size_t i = 0; i < counts.size(); i += blockSize) {
    const std::size_t width = bytes[sizeof pixelCount + i / blockSize];
    const std::uint32_t mask = (std::uint32_t{1} << width) - 1;
    for (std::size_t k = 0; k < blockSize; ++k) {
      const std::size_t bit = k * width;
      counts[i + k] = (fourBytes(block + bit / 8) >> (bit % 8)) & mask;
    }
    block += blockSize / 8 * width;
  }
  return cdfOf(counts, pixelCount);
}

}  // namespace

PackedCDF::PackedCDF(const GreenCDF& cdf, std::uint64_t pixelCount) {
  const auto counted =
      static_cast<std::uint32_t>(std::min<std::uint64_t>(pixelCount, largestCount));
  if (const std::optional<Counts> counts = countsOf(cdf, counted)) {
    bytes_ = packed(*counts, counted);
  } else {
    bytes_.resize(sizeof cdf);
    std::memcpy(bytes_.data(), cdf.data(), sizeof cdf);
  }
}

GreenCDF PackedCDF::unpacked() const {
  GreenCDF cdf{};
  if (bytes_.size() != sizeof cdf) return bytes_.empty() ? cdf : unpackedCounts(bytes_);
  std::memcpy(cdf.data(), bytes_.data(), sizeof cdf);
  return cdf;
}

}  // namespace pelorin::image_processing
