#include "photo/png/png_losses.h"

#include <algorithm>
#include <string>
#include <string_view>
#include <utility>

#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/mpf.h"
#include "photo/metadata/photoshop_resources.h"
#include "photo/metadata/segments.h"
#include "photo/metadata/xmp_container.h"
#include "photo/metadata/xmp_segments.h"

namespace pelorin::photo {
namespace {

constexpr std::uint8_t app0 = 0xE0, app1 = 0xE1, app2 = 0xE2, comment = 0xFE;
constexpr std::string_view noPlace = "a PNG file has no place for it";

void addPixelsPerMetre(std::vector<PngChunk>& chunks, std::uint32_t across, std::uint32_t down) {
  PngChunk chunk{"pHYs", {}};
  for (const std::uint32_t number : {across, down}) {
    for (int shift = 24; shift >= 0; shift -= 8)
      chunk.data.push_back(static_cast<std::uint8_t>(number >> shift));
  }
  constexpr std::uint8_t metre = 1;
  chunk.data.push_back(metre);
  chunks.push_back(std::move(chunk));
}

// What a JFIF segment says beside the version: pixels an inch or a centimetre.
void keepResolution(std::span<const std::uint8_t> jfif, std::vector<PngChunk>& chunks) {
  constexpr std::size_t unitPlace = 2;
  constexpr std::uint8_t inch = 1, centimetre = 2;
  if (jfif.size() < unitPlace + 5) return;
  const std::uint8_t unit = jfif[unitPlace];
  if (unit != inch && unit != centimetre) return;
  const auto inMetres = [&](std::size_t place) {
    const std::uint32_t density = std::uint32_t{jfif[place]} << 8 | jfif[place + 1];
    return unit == centimetre ? density * 100 : (density * 10000 + 127) / 254;
  };
  addPixelsPerMetre(chunks, inMetres(unitPlace + 1), inMetres(unitPlace + 3));
}

class Removal {
 public:
  explicit Removal(KeptMetadata& kept)
      : kept_(kept), profileIsWhole_(!colourProfileOf(kept.segments).empty()) {}

  void run() {
    std::erase_if(kept_.segments, [this](const MetadataSegment& s) { return !stays(s); });
  }

 private:
  bool stays(const MetadataSegment& segment) {
    if (segment.marker == comment) return true;
    if (isColourProfile(segment)) {
      if (!profileIsWhole_) lose("colour profile", "a part of it is missing");
      return profileIsWhole_;
    }
    if (segment.marker == app1 && isExif(segment.payload)) return isFirst(hasExif_, "second EXIF");
    if (isXmpPacket(segment)) return isFirst(hasXmp_, "second packet of XMP");
    if (const auto jfif = contentOf({&segment, 1}, app0, {"JFIF\0", 5}); !jfif.empty()) {
      const auto isResolution = [](const PngChunk& chunk) { return chunk.type == "pHYs"; };
      if (std::ranges::none_of(kept_.chunks, isResolution)) keepResolution(jfif, kept_.chunks);
      return false;
    }
    // They claim what went.
    if (segment.marker == app2 && (isMpf(segment.payload) || isIsoGainMap(segment))) return false;
    if (isPhotoshopResources(segment)) {
      lose("IPTC or another resource of Photoshop's", noPlace);
    } else {
      lose("APP" + std::to_string(segment.marker - app0) + " segment", noPlace);
    }
    return false;
  }

  bool isFirst(bool& has, const std::string& name) {
    if (has) lose(name, noPlace);
    return !std::exchange(has, true);
  }

  void lose(const std::string& what, std::string_view why) {
    const Loss loss = {what, std::string(why)};
    if (std::ranges::find(kept_.lost, loss) == kept_.lost.end()) kept_.lost.push_back(loss);
  }

  KeptMetadata& kept_;
  bool profileIsWhole_, hasExif_ = false, hasXmp_ = false;
};

}  // namespace

void removeWhatPngLacks(KeptMetadata& kept) {
  if (!kept.tail.empty()) {
    editXmp(
        kept.segments, [](XmpPacket& packet) { stateAppended(packet, {}); }, kept.lost);
  }
  for (const TailPart& part : kept.tail)
    kept.lost.push_back({std::string(nameOf(part.kind)), std::string(noPlace)});
  kept.tail.clear();
  mergeXmpExtensions(kept.segments, kept.lost);
  Removal(kept).run();
}

}  // namespace pelorin::photo
