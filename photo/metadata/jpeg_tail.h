#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

namespace pelorin::photo {

/// One of the things that programs append to a JPEG file.
struct TailPart {
  enum class Kind {
    gainMap,        ///< A JPEG file that says so, in the words of hdrgm, ISO 21496-1 or Apple.
    picture,        ///< Another JPEG file: a preview, a view, a frame.
    video,          ///< MP4, as motion photos have it.
    samsung,        ///< Blocks and the table of them, places counted back from the table.
    canonVrd,       ///< Canon's recipe, which holds no places.
    photoMechanic,  ///< Camera Bits' tags, which hold no places.
    fotoStation,    ///< May hold previews.
    afcp,           ///< Places are counted from the file's beginning.
    mie,            ///< Anything.
    unknown
  };

  Kind kind;
  std::vector<std::uint8_t> bytes;
};

/// "MPF preview" and the like, for a user.
std::string_view nameOf(TailPart::Kind kind);

/// What stands behind the end mark of a JPEG file, in order. Parts are known by what they are, not
/// by what the file says of their places. Any bytes are safe; zeros between parts belong to none.
std::vector<TailPart> readTail(std::span<const std::uint8_t> tail);

/// Whether a block of Samsung's trailer is another picture, such as the shots that one was made of.
/// Any bytes are safe.
bool samsungHoldsPictures(std::span<const std::uint8_t> trailer);

/// Whether a JPEG file is a gain map by its own segments.
bool isGainMap(std::span<const std::uint8_t> file);

}  // namespace pelorin::photo
