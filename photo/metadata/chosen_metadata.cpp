#include "photo/metadata/chosen_metadata.h"

#include <algorithm>
#include <array>
#include <string_view>
#include <utility>

#include "photo/metadata/exif_excerpt.h"
#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/jpeg_tail.h"
#include "photo/metadata/mpf.h"
#include "photo/metadata/photoshop_resources.h"
#include "photo/metadata/segments.h"
#include "photo/metadata/xmp_segments.h"

namespace pelorin::photo {
namespace {

using Kind = MetadataKind;

constexpr std::uint8_t app1 = 0xE1, app2 = 0xE2;

// Empty stands for the whole namespace.
struct ChosenName {
  Kind kind;
  XmpName name;
};
constexpr std::string_view exifSpace = "http://ns.adobe.com/exif/1.0/",
                           tiffSpace = "http://ns.adobe.com/tiff/1.0/",
                           dublinCore = "http://purl.org/dc/elements/1.1/",
                           photoshop = "http://ns.adobe.com/photoshop/1.0/";
constexpr ChosenName chosenNames[] = {
    {Kind::copyright, {dublinCore, "creator"}},
    {Kind::copyright, {dublinCore, "rights"}},
    {Kind::copyright, {"http://ns.adobe.com/xap/1.0/rights/", ""}},
    {Kind::copyright, {"http://creativecommons.org/ns#", ""}},
    {Kind::copyright, {photoshop, "Credit"}},
    {Kind::copyright, {tiffSpace, "Artist"}},
    {Kind::copyright, {tiffSpace, "Copyright"}},
    {Kind::time, {exifSpace, "DateTimeOriginal"}},
    {Kind::time, {exifSpace, "DateTimeDigitized"}},
    {Kind::time, {photoshop, "DateCreated"}},
    {Kind::time, {"http://ns.adobe.com/xap/1.0/", "CreateDate"}},
    {Kind::gainMap, {"http://ns.adobe.com/hdr-gain-map/1.0/", ""}},
    {Kind::gainMap, {"http://ns.apple.com/HDRGainMap/1.0/", ""}},
    {Kind::gainMap, {"http://ns.google.com/photos/1.0/container/", "Directory"}},
};

// Exif's tags, record 2 of IPTC, and keywords of texts in PNG files.
constexpr std::uint16_t copyrightTags[] = {0x013B, 0x8298},
                        timeTags[] = {0x0132, 0x9003, 0x9004, 0x9010, 0x9011,
                                      0x9012, 0x9290, 0x9291, 0x9292};
constexpr std::uint8_t copyrightSets[] = {80, 110, 116}, timeSets[] = {55, 60};
constexpr std::string_view copyrightWords[] = {"Author", "Copyright"}, timeWord = "Creation Time",
                           colourTypes[] = {"gAMA", "cHRM", "sRGB"};

class Choice {
 public:
  explicit Choice(const std::set<Kind>& kinds) : kinds_(kinds) {}

  bool has(Kind kind) const { return kinds_.contains(kind); }
  bool excerpts() const { return has(Kind::copyright) || has(Kind::time); }

  // What both kinds of excerpt have in common: a list each.
  template <typename Value, typename Copyright, typename Time>
  std::vector<Value> values(const Copyright& copyright, const Time& time) const {
    std::vector<Value> all;
    if (has(Kind::copyright)) all.assign(std::begin(copyright), std::end(copyright));
    if (has(Kind::time)) all.insert(all.end(), std::begin(time), std::end(time));
    return all;
  }

  bool keeps(XmpName name) const {
    return std::any_of(std::begin(chosenNames), std::end(chosenNames), [&](const ChosenName& c) {
      return has(c.kind) && c.name.space == name.space &&
             (c.name.local.empty() || c.name.local == name.local);
    });
  }

  bool keeps(const PngChunk& chunk) const {
    if (std::ranges::find(colourTypes, chunk.type) != std::end(colourTypes)) return true;
    const std::string_view data(reinterpret_cast<const char*>(chunk.data.data()),
                                chunk.data.size());
    const std::string_view keyword = data.substr(0, data.find('\0'));
    const bool isCopyright = std::ranges::find(copyrightWords, keyword) != std::end(copyrightWords);
    return (has(Kind::copyright) && isCopyright) || (has(Kind::time) && keyword == timeWord);
  }

 private:
  const std::set<Kind>& kinds_;
};

bool isXmp(const MetadataSegment& segment) {
  return isXmpExtension(segment) || !contentOf({&segment, 1}, app1, xmpMark).empty();
}

bool isGainMapClaim(const MetadataSegment& segment) {
  return segment.marker == app2 && (isMpf(segment.payload) || isIsoGainMap(segment));
}

void chooseOfXmp(std::vector<MetadataSegment>& segments, const Choice& choice) {
  std::vector<Loss> unreadable;  // cannot be chosen either
  bool anything = false;
  editXmp(
      segments,
      [&](XmpPacket& packet) {
        packet.keepOnly([&](XmpName name) {
          const bool kept = choice.keeps(name);
          anything = anything || kept;
          return kept || name.local == "HasExtendedXMP";
        });
      },
      unreadable);
  if (!anything) std::erase_if(segments, isXmp);
}

}  // namespace

Metadata chosenMetadata(const Metadata& metadata, const std::set<Kind>& kinds) {
  const Choice choice(kinds);
  Metadata chosen = {.segments = {},
                     .storedSize = metadata.storedSize,
                     .orientation = metadata.orientation,
                     .turn = metadata.turn};
  const bool someXmp = choice.excerpts() || choice.has(Kind::gainMap);
  for (const MetadataSegment& segment : metadata.segments) {
    if (isColourProfile(segment)) {
      chosen.segments.push_back(segment);
    } else if (segment.marker == app1 && isExif(segment.payload)) {
      if (choice.has(Kind::exif)) {
        chosen.segments.push_back(segment);
      } else if (choice.excerpts()) {
        const auto tags = choice.values<std::uint16_t>(copyrightTags, timeTags);
        std::vector<std::uint8_t> excerpt = exifExcerpt(segment.payload, tags);
        if (!excerpt.empty()) chosen.segments.push_back({app1, std::move(excerpt)});
      }
    } else if (isXmp(segment)) {
      if (choice.has(Kind::xmp) || someXmp) chosen.segments.push_back(segment);
    } else if (isPhotoshopResources(segment)) {
      if (choice.has(Kind::iptc)) {
        chosen.segments.push_back(segment);
      } else if (choice.excerpts()) {
        const auto sets = choice.values<std::uint8_t>(copyrightSets, timeSets);
        MetadataSegment excerpt = iptcExcerpt(segment, sets);
        if (!excerpt.payload.empty()) chosen.segments.push_back(std::move(excerpt));
      }
    } else if (choice.has(Kind::gainMap) && isGainMapClaim(segment)) {
      chosen.segments.push_back(segment);
    }
  }
  if (someXmp && !choice.has(Kind::xmp)) chooseOfXmp(chosen.segments, choice);
  std::copy_if(metadata.chunks.begin(), metadata.chunks.end(), std::back_inserter(chosen.chunks),
               [&](const PngChunk& chunk) { return choice.keeps(chunk); });
  if (choice.has(Kind::gainMap)) {
    for (const TailPart& part : readTail(metadata.tail)) {
      if (part.kind == TailPart::Kind::gainMap)
        chosen.tail.insert(chosen.tail.end(), part.bytes.begin(), part.bytes.end());
    }
  }
  return chosen;
}

}  // namespace pelorin::photo
