#pragma once

#include <cstddef>
#include <cstdint>

namespace pelorin::image_processing {

/// Rows of a summed-area table that are formed at once.
inline constexpr std::int64_t sumRowsAtOnce = 16;

/// Floats behind each row that `sumRows` may read and write as it likes.
inline constexpr std::int64_t sumRowsPadding = 2 * sumRowsAtOnce + 8;

/// Turns rows of weights into the next rows of their summed-area table, in place. With j the
/// column and i the row, in float and in this order,
///
///     S(j, i) = ((weight(j, i) + S(j, i - 1)) + S(j - 1, i)) - S(j - 1, i - 1).
///
/// Left of the first column stands its mirror image, column 1, as far as it is formed: S(-1, i) is
/// 0 and S(-1, i - 1) is S(1, i - 1).
/// @param above   the row of sums above, or zeros: `width` floats, at least 2, and the padding.
/// @param rows    the first of `sumRowsAtOnce` rows, `stride` floats apart, padded as well.
/// Never throws and keeps no state. Weights and sums are ordinary numbers.
void sumRows(const float* above, float* rows, std::ptrdiff_t stride, std::int64_t width);

/// The definition of `sumRows`; leaves the padding alone.
void sumRowsScalar(const float* above, float* rows, std::ptrdiff_t stride, std::int64_t width);

}  // namespace pelorin::image_processing
