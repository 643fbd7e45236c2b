#pragma once

#include <array>
#include <cstdint>
#include <utility>

namespace pelorin::photo {

/// A mirroring from left to right (first, where there is one), then quarter turns clockwise.
struct Turn {
  struct Place {
    std::uint32_t row, column;
  };

  bool mirrored = false;
  int quarters = 0;  ///< 0 ... 3

  // The same as what becomes of rows and columns: their orders are reversed, then they are
  // exchanged.
  bool reversesRows() const { return quarters == 1 || quarters == 2; }
  bool reversesColumns() const { return mirrored != (quarters >= 2); }
  bool swapsAxes() const { return quarters % 2 == 1; }

  /// Where a place of the turned picture lies in the picture of rows x columns.
  Place sourceOf(Place turned, std::uint32_t rows, std::uint32_t columns) const {
    if (swapsAxes()) std::swap(turned.row, turned.column);
    return {reversesRows() ? rows - 1 - turned.row : turned.row,
            reversesColumns() ? columns - 1 - turned.column : turned.column};
  }

  friend bool operator==(const Turn&, const Turn&) = default;
};

/// The turn that shows a picture with this EXIF orientation upright; none for values that are not
/// 1 ... 8.
inline Turn uprightTurn(int orientation) {
  constexpr std::array<Turn, 8> turns = {
      {{false, 0}, {true, 0}, {false, 2}, {true, 2}, {true, 3}, {false, 1}, {true, 1}, {false, 3}}};
  return orientation >= 1 && orientation <= 8 ? turns[orientation - 1] : Turn{};
}

/// `first`, then `degrees` clockwise, a multiple of 90 of either sign.
inline Turn turnedFurther(Turn first, int degrees) {
  const int quarters = (degrees / 90 % 4 + 4) % 4;
  return {first.mirrored, (first.quarters + quarters) % 4};
}

}  // namespace pelorin::photo
