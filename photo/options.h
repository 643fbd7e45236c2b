#pragma once

#include <optional>
#include <stop_token>

#include "photo/decode_limits.h"
#include "photo/file_view.h"
#include "photo/jpeg/jpeg_coding.h"
#include "photo/metadata/edit_mark.h"
#include "photo/metadata/kept_metadata.h"
#include "photo/picture_size.h"

namespace pelorin::photo {

struct OpenOptions {
  int scale = 1;        ///< 1, 2, 4 or 8: what its sides are divided by, rounded up.
  int rotate = 0;       ///< Degrees clockwise beyond upright, a multiple of 90.
  bool upright = true;  ///< Else the picture is as it is stored, and `rotate` idle.
  std::optional<PictureSize> raw = {};  ///< The bytes are raw pixels of this size.
  bool faces = true;                    ///< Read those that the file knows of.
  DecodeLimits limits = {};
  std::stop_token stop = {};  ///< Asked between steps; the default never stops.
};

/// How much colour a file holds, where its format has a choice.
enum class ColourDetail {
  usual,  ///< As photos have it: less of it than of brightness in formats that lose something.
  full,   ///< For thin lines and text.
  none,   ///< For grey pictures: one channel, red.
};

/// As a quality: the one that the photo's own file seems to have, 90 where it tells none.
constexpr int sourceQuality = -1;

struct SaveOptions {
  int quality = 90;           ///< 1 ... 100, for formats that lose something, or `sourceQuality`.
  std::stop_token stop = {};  ///< Asked between steps; the default never stops.
  KeepOptions keep = {};      ///< Of the metadata.
  std::optional<EditMark> mark = {};  ///< Added to the history, whatever else is kept, where the
                                      ///< format holds one.
  ColourDetail colour = ColourDetail::usual;
  /// Of a JPEG file; else that of the photo's own one, and 4:2:0 where it tells none.
  std::optional<ChromaSampling> sampling = {};
  /// Takes what of a long file stands behind its first 8 MiB, in formats that can part it; null to have
  /// all of it in memory. Empty before, for one file, and outlives the writing of it.
  ByteStore* overflow = nullptr;
};

/// @throws Stopped when `stop` asks for it.
void stopIfAsked(const std::stop_token& stop);

}  // namespace pelorin::photo
