#pragma once

#include <cstdint>
#include <memory>
#include <span>

namespace pelorin::photo {

/// Turns CMYK pixels into RGBA in place, alpha 255.
class CmykToRgba {
 public:
  /// @param inverted  whether 255 is no ink (as Adobe writes files) or full ink.
  /// @param profile   an ICC profile for the inks, to sRGB with perceptual intent. Empty, or one
  ///                  that does not read or is not for CMYK: light = (1 - ink) (1 - black).
  CmykToRgba(bool inverted, std::span<const std::uint8_t> profile);

  void convertRow(std::uint8_t* row, std::uint32_t width) const;

 private:
  struct DeleteTransform {
    void operator()(void* transform) const;
  };

  bool inverted_;
  std::unique_ptr<void, DeleteTransform> transform_;  // null when the profile is of no use
};

}  // namespace pelorin::photo
