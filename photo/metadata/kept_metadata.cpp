#include "photo/metadata/kept_metadata.h"

#include <algorithm>
#include <array>
#include <optional>
#include <string_view>
#include <utility>

#include "photo/jpeg/jpeg_codec.h"
#include "photo/jpeg/jpeg_turn_pixels.h"
#include "photo/metadata/exif_edit.h"
#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/mpf.h"
#include "photo/metadata/photoshop_resources.h"
#include "photo/metadata/picture_change.h"
#include "photo/metadata/segments.h"
#include "photo/metadata/thumbnail.h"
#include "photo/metadata/xmp_container.h"
#include "photo/metadata/xmp_depth.h"
#include "photo/metadata/xmp_facts.h"
#include "photo/metadata/xmp_regions.h"
#include "photo/metadata/xmp_segments.h"

namespace pelorin::photo {
namespace {

using namespace std::string_view_literals;
using image_processing::Image;
using image_processing::RGBA8Pixel;
using Kind = TailPart::Kind;

constexpr std::uint8_t app0 = 0xE0, app1 = 0xE1, app2 = 0xE2, app11 = 0xEB;

bool startsWith(const MetadataSegment& segment, std::uint8_t marker, std::string_view mark) {
  return segment.marker == marker && segment.payload.size() >= mark.size() &&
         std::equal(mark.begin(), mark.end(), segment.payload.begin(),
                    [](char a, std::uint8_t b) { return static_cast<std::uint8_t>(a) == b; });
}

bool holds(const MetadataSegment& segment, std::string_view text) {
  const auto& bytes = segment.payload;
  return std::search(bytes.begin(), bytes.end(), text.begin(), text.end()) != bytes.end();
}

bool isMpfIndex(const MetadataSegment& segment) {
  return segment.marker == app2 && isMpf(segment.payload);
}
bool isJumbf(const MetadataSegment& segment) {
  return startsWith(segment, app11, "JP"sv);
}

// JFIF may have a thumbnail of bare pixels, in its segment or in an extension.
void removeJfifThumbnails(std::vector<MetadataSegment>& segments, std::vector<Loss>& lost) {
  constexpr std::size_t sizePlace = 12, headerSize = 14;
  const auto name = [&] { lost.push_back({"JFIF thumbnail", "shows the picture as it was"}); };
  for (MetadataSegment& segment : segments) {
    if (!startsWith(segment, app0, "JFIF\0"sv) || segment.payload.size() <= headerSize) continue;
    segment.payload.resize(headerSize);
    segment.payload[sizePlace] = segment.payload[sizePlace + 1] = 0;
    name();
  }
  if (std::erase_if(segments, [](const MetadataSegment& segment) {
        return startsWith(segment, app0, "JFXX\0"sv);
      }) > 0)
    name();
}

void removeSignatures(std::vector<MetadataSegment>& segments, std::vector<Loss>& lost) {
  const auto isC2pa = [](const MetadataSegment& s) { return isJumbf(s) && holds(s, "c2pa"); };
  const bool hasC2pa = std::any_of(segments.begin(), segments.end(), isC2pa);
  if (std::erase_if(segments, isJumbf) == 0) return;
  lost.push_back(hasC2pa ? Loss{"C2PA manifest", "an edit breaks its signature"}
                         : Loss{"JUMBF boxes", "may describe the picture as it was"});
}

// What the sides of the picture were divided by; 1 where it was not by one number of these.
unsigned divisorOf(const PictureChange& change) {
  PictureSize before = change.before;
  if (change.turn.swapsAxes()) std::swap(before.width, before.height);
  for (const unsigned divisor : {1u, 2u, 4u, 8u}) {
    const auto smaller = [&](std::uint32_t side) { return side / divisor + (side % divisor != 0); };
    if (PictureSize{smaller(before.width), smaller(before.height)} == change.after) return divisor;
  }
  return 1;
}

std::vector<std::uint8_t> changedGainMap(const std::vector<std::uint8_t>& file,
                                         const PictureChange& change) {
  const Turn turn = change.turn;
  const unsigned divisor = divisorOf(change);
  if (divisor > 1) return turnPixels(file, turn, divisor);
  if (turn == Turn{}) return file;
  // Whether blocks can be moved without cutting partial ones off.
  constexpr std::uint32_t largestUnit = 32;
  const JpegHeader header = readJpegHeader(file);
  const bool movable = header.width % largestUnit == 0 && header.height % largestUnit == 0;
  if (!turn.mirrored && movable) return rotateJpeg(file, 90 * turn.quarters);
  return turnPixels(file, turn);
}

// Decides about each part; afterwards only those to be written are left.
std::vector<TailPart> keptTail(const Metadata& metadata, const PictureChange& change,
                               const KeepOptions& options, std::vector<Loss>& lost) {
  std::vector<TailPart> kept;
  bool hasGainMap = false;
  for (TailPart& part : readTail(metadata.tail)) {
    const auto lose = [&](std::string_view why) {
      lost.push_back({std::string(nameOf(part.kind)), std::string(why)});
    };
    switch (part.kind) {
      case Kind::gainMap:
        if (!options.gainMap) continue;
        if (hasGainMap) {
          lose("there is another");
          continue;
        }
        try {
          part.bytes = changedGainMap(part.bytes, change);
        } catch (const PhotoError& error) {
          lose(error.what());
          continue;
        }
        hasGainMap = true;
        break;
      case Kind::samsung:
        if (options.location && samsungHoldsPictures(part.bytes)) {
          lose("shows the picture as it was");
          continue;
        }
        [[fallthrough]];
      case Kind::video:
        if (!options.location) continue;  // videos tell it too
        break;
      case Kind::canonVrd:
      case Kind::photoMechanic:
        if (!isUnmoved(change)) {
          lose("counts in pixels of the picture as it was");
          continue;
        }
        break;
      case Kind::picture:
        lose("shows the picture as it was");
        continue;
      case Kind::fotoStation:
        lose("may show the picture as it was");
        continue;
      case Kind::afcp:
        lose("counts its places from the file's beginning");
        continue;
      case Kind::mie:
      case Kind::unknown:
        lose("is not known well enough to be kept true");
        continue;
    }
    kept.push_back(std::move(part));
  }
  return kept;
}

Appended appendedBy(const std::vector<TailPart>& tail) {
  Appended appended;
  for (const TailPart& part : tail) {
    if (appended.videoSize) appended.afterVideo += part.bytes.size();
    if (part.kind == Kind::gainMap) appended.gainMapSize = part.bytes.size();
    if (part.kind == Kind::video) appended.videoSize = part.bytes.size();
    if (part.kind == Kind::samsung) appended.videoInTrailer = !appended.videoSize;
  }
  return appended;
}

// The index keeps its place among the segments; its numbers come when the file is there.
void replaceIndex(std::vector<MetadataSegment>& segments, bool hasGainMap) {
  bool placed = false;
  std::erase_if(segments, [&](MetadataSegment& segment) {
    if (!isMpfIndex(segment)) return false;
    if (!hasGainMap || placed) return true;
    segment.payload = writeMpf(std::array<MpfEntry, 2>{});
    placed = true;
    return false;
  });
}

void removeLocation(XmpPacket& packet) {
  for (const std::string_view local : {"GPSLatitude",          "GPSLongitude",
                                       "GPSAltitude",          "GPSAltitudeRef",
                                       "GPSTimeStamp",         "GPSDateStamp",
                                       "GPSSatellites",        "GPSStatus",
                                       "GPSMeasureMode",       "GPSDOP",
                                       "GPSSpeedRef",          "GPSSpeed",
                                       "GPSTrackRef",          "GPSTrack",
                                       "GPSImgDirectionRef",   "GPSImgDirection",
                                       "GPSMapDatum",          "GPSDestLatitude",
                                       "GPSDestLongitude",     "GPSDestBearingRef",
                                       "GPSDestBearing",       "GPSDestDistanceRef",
                                       "GPSDestDistance",      "GPSProcessingMethod",
                                       "GPSAreaInformation",   "GPSDifferential",
                                       "GPSHPositioningError", "GPSVersionID"}) {
    for (XmpProperty& property : packet.properties({"http://ns.adobe.com/exif/1.0/", local}))
      property.remove();
  }
}

}  // namespace

KeptMetadata keptMetadata(const Image<RGBA8Pixel>& picture, const Metadata& metadata,
                          const KeepOptions& options) {
  ThumbnailMaker thumbnails(picture);
  return keptMetadata({picture.width, picture.height}, thumbnails, metadata, options);
}

void expectThumbnails(ThumbnailMaker& thumbnails, PictureSize picture, const Metadata& metadata,
                      const KeepOptions& options) {
  Metadata exif = {.segments = {},
                   .storedSize = metadata.storedSize,
                   .orientation = metadata.orientation,
                   .turn = metadata.turn};
  for (const MetadataSegment& segment : metadata.segments) {
    if (segment.marker == app1 && isExif(segment.payload)) exif.segments.push_back(segment);
  }
  keptMetadata(picture, thumbnails, exif, options);
}

KeptMetadata keptMetadata(PictureSize picture, ThumbnailMaker& thumbnails, const Metadata& metadata,
                          const KeepOptions& options) {
  if (options.only) {
    KeepOptions all = options;
    all.only.reset();
    return keptMetadata(picture, thumbnails, chosenMetadata(metadata, *options.only), all);
  }
  KeptMetadata kept;
  kept.segments = metadata.segments;
  kept.chunks = metadata.chunks;
  const PictureChange change = {metadata.storedSize, picture, metadata.turn, metadata.orientation};
  kept.tail = keptTail(metadata, change, options, kept.lost);
  const Appended appended = appendedBy(kept.tail);

  std::vector<MetadataSegment>& segments = kept.segments;
  std::vector<Loss> thumbnailsLost;
  for (MetadataSegment& segment : segments) {
    if (segment.marker != app1 || !isExif(segment.payload)) continue;
    if (!options.location) removeExifLocation(segment.payload);
    editExif(segment.payload, change, options.thumbnail ? &thumbnails : nullptr, thumbnailsLost);
  }
  editXmp(
      segments,
      [&](XmpPacket& packet) {
        stateFacts(packet, change, thumbnailsLost);
        turnRegions(packet, change);
        removeUntrueViews(packet, change, kept.lost);
        stateAppended(packet, appended);
        if (!options.location) removeLocation(packet);
      },
      kept.lost);
  removeJfifThumbnails(segments, thumbnailsLost);
  removePhotoshopThumbnails(segments, thumbnailsLost);
  if (options.thumbnail)
    kept.lost.insert(kept.lost.end(), thumbnailsLost.begin(), thumbnailsLost.end());
  removeSignatures(segments, kept.lost);
  replaceIndex(segments, appended.gainMapSize.has_value());
  if (!appended.gainMapSize) std::erase_if(segments, isIsoGainMap);
  return kept;
}

void removeColourProfile(std::vector<MetadataSegment>& segments) {
  std::erase_if(segments, isColourProfile);
}

void appendTail(std::vector<std::uint8_t>& file, const std::vector<TailPart>& tail) {
  const std::size_t pictureSize = file.size();
  std::optional<MpfEntry> gainMap;
  for (const TailPart& part : tail) {
    if (part.kind == Kind::gainMap) {
      gainMap = {mpfUndefined, static_cast<std::uint32_t>(part.bytes.size()),
                 static_cast<std::uint32_t>(file.size())};
    }
    file.insert(file.end(), part.bytes.begin(), part.bytes.end());
  }
  if (!gainMap) return;
  for (std::size_t at = 2; at + 4 <= pictureSize && file[at] == 0xFF && file[at + 1] != 0xDA;) {
    const std::size_t length = std::size_t{file[at + 2]} << 8 | file[at + 3];
    const std::size_t payload = at + 4;
    if (length < 2 || length > pictureSize - at - 2) return;
    if (file[at + 1] == app2 && isMpf(std::span(file).subspan(payload, length - 2))) {
      gainMap->offset -= static_cast<std::uint32_t>(payload + mpfHeaderPlace);
      const std::vector<std::uint8_t> index = writeMpf(
          std::array{MpfEntry{mpfPrimary, static_cast<std::uint32_t>(pictureSize), 0}, *gainMap});
      if (index.size() == length - 2)
        std::copy(index.begin(), index.end(), file.begin() + static_cast<std::ptrdiff_t>(payload));
      return;
    }
    at += 2 + length;
  }
}

}  // namespace pelorin::photo
