#pragma once

#include <cstdint>
#include <optional>

#include "photo/metadata/xmp_packet.h"

namespace pelorin::photo {

/// What stands behind the picture in the file to be written.
struct Appended {
  std::optional<std::uint64_t> gainMapSize;  ///< In bytes; none when there is no gain map.
  std::optional<std::uint64_t> videoSize;    ///< Likewise.
  std::uint64_t afterVideo = 0;              ///< Bytes from the video's end to the file's.
  bool videoInTrailer = false;  ///< Part of a trailer that is as it was, and still the file's end.
};

/// Makes a packet claim what the file holds and nothing else: the items of Google's container, the
/// gain map (hdrgm), the motion photo (GCamera).
void stateAppended(XmpPacket& packet, const Appended& appended);

}  // namespace pelorin::photo
