#pragma once

#include <cstdint>

#include "image_processing/core/pixel_types.h"

namespace pelorin::image_processing {

// Pictures as rows, for what never needs one as a whole. Who asks for rows, and who takes them, is
// the caller's: a decoder, a file, a picture in memory.

/// The rows of a picture from top to bottom, once.
class RowSource {
 public:
  virtual ~RowSource() = default;

  /// The next `count` rows, back to back; no more than are left.
  /// @param room  of that many rows, for a source that has its rows nowhere yet.
  /// @returns `room`, written; or where the rows stand, unchanged as long as the source is used.
  /// What it throws passes through.
  virtual const RGBA8Pixel* next(std::uint32_t count, RGBA8Pixel* room) = 0;

  /// Where all rows that are left stand already, back to back; null where they come one by one.
  virtual const RGBA8Pixel* standing() const { return nullptr; }
};

/// Takes the rows of a picture from top to bottom.
class RowSink {
 public:
  virtual ~RowSink() = default;

  /// The next `count` rows, back to back. What it throws passes through.
  virtual void write(const RGBA8Pixel* rows, std::uint32_t count) = 0;
};

}  // namespace pelorin::image_processing
