#pragma once

#include <cstddef>
#include <cstdint>

#include "image_processing/features/xy.h"

// The loops over pixels behind the corner detectors. They work on rows of a score map: a byte for
// each pixel, 0 where there is no corner, otherwise its score + 1. None throws or keeps state.

namespace pelorin::image_processing {

/// Scores the pixels of one row in columns `begin` ... `end` - 1, which need three columns on
/// either side and three rows above and below.
/// @param row        the row's pixel of column 0.
/// @param stride     bytes from a row to the next, of either sign.
/// @param arc        how many neighbouring circle pixels make a corner, 9 to 12.
/// @param threshold  0 to 254.
/// @param scores     the row of the map, written in the same columns and nowhere else.
/// @returns whether there is a corner.
bool fastScoreRow(const std::uint8_t* row, std::ptrdiff_t stride, std::size_t begin,
                  std::size_t end, int arc, int threshold, std::uint8_t* scores);

/// The definition of `fastScoreRow`.
bool fastScoreRowScalar(const std::uint8_t* row, std::ptrdiff_t stride, std::size_t begin,
                        std::size_t end, int arc, int threshold, std::uint8_t* scores);

/// Lists the corners of a row of the map in columns `begin` ... `end` - 1, left to right.
/// @param corners  written; room for `end` - `begin` of them. Each gets `y` as its row.
/// @returns how many there are.
std::size_t fastListCorners(const std::uint8_t* scores, std::size_t begin, std::size_t end, int y,
                            xy* corners);

/// The definition of `fastListCorners`.
std::size_t fastListCornersScalar(const std::uint8_t* scores, std::size_t begin, std::size_t end,
                                  int y, xy* corners);

/// As `fastListCorners`, but only corners that score higher than each of their eight neighbours; of
/// neighbours with the same score none is listed.
/// @param above, below  the rows of the map around `scores`. One column more on either side is read
///                      in all three.
std::size_t fastListMaxima(const std::uint8_t* above, const std::uint8_t* scores,
                           const std::uint8_t* below, std::size_t begin, std::size_t end, int y,
                           xy* corners);

/// The definition of `fastListMaxima`.
std::size_t fastListMaximaScalar(const std::uint8_t* above, const std::uint8_t* scores,
                                 const std::uint8_t* below, std::size_t begin, std::size_t end,
                                 int y, xy* corners);

}  // namespace pelorin::image_processing
