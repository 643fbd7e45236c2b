#include "photo/metadata/xmp_container.h"

#include <string>

namespace pelorin::photo {
namespace {

constexpr std::string_view container = "http://ns.google.com/photos/1.0/container/";
constexpr std::string_view itemFields = "http://ns.google.com/photos/1.0/container/item/";
constexpr std::string_view camera = "http://ns.google.com/photos/1.0/camera/";
constexpr std::string_view gainMap = "http://ns.adobe.com/hdr-gain-map/1.0/";
constexpr std::string_view appleGainMap = "http://ns.apple.com/HDRGainMap/1.0/";

void removeAll(XmpPacket& packet, XmpName name) {
  for (XmpProperty& property : packet.properties(name)) property.remove();
}

// Whether the item stays.
bool stateItem(const XmpProperty& item, const Appended& appended) {
  const std::string semantic = item.field({itemFields, "Semantic"}).text();
  XmpProperty length = item.field({itemFields, "Length"});
  if (XmpProperty padding = item.field({itemFields, "Padding"})) {
    if (!appended.videoInTrailer || semantic != "Primary") padding.setText("0");
  }
  if (semantic == "Primary") {
    if (length && length.text() != "0") length.remove();
    return true;
  }
  const bool isVideo = semantic == "MotionPhoto";
  if (isVideo && appended.videoInTrailer) return true;
  const std::optional<std::uint64_t> size = isVideo                 ? appended.videoSize
                                            : semantic == "GainMap" ? appended.gainMapSize
                                                                    : std::nullopt;
  if (size && length) length.setText(std::to_string(*size));
  return size.has_value();
}

void stateDirectory(XmpProperty directory, const Appended& appended) {
  bool onlyPrimary = true;
  for (XmpProperty& entry : directory.items()) {
    const XmpProperty item = entry.field({container, "Item"});
    if (!stateItem(item ? item : entry, appended)) {
      entry.remove();
      continue;
    }
    const XmpProperty semantic = (item ? item : entry).field({itemFields, "Semantic"});
    onlyPrimary = onlyPrimary && semantic.text() == "Primary";
  }
  if (onlyPrimary) directory.remove();
}

}  // namespace

void stateAppended(XmpPacket& packet, const Appended& appended) {
  for (const XmpProperty& directory : packet.properties({container, "Directory"}))
    stateDirectory(directory, appended);
  if (!appended.gainMapSize) {
    for (const std::string_view local :
         {"Version", "BaseRenditionIsHDR", "GainMapMin", "GainMapMax", "Gamma", "OffsetSDR",
          "OffsetHDR", "HDRCapacityMin", "HDRCapacityMax"})
      removeAll(packet, {gainMap, local});
    for (const std::string_view local : {"HDRGainMapVersion", "HDRGainMapHeadroom"})
      removeAll(packet, {appleGainMap, local});
  }
  if (appended.videoInTrailer) return;
  if (appended.videoSize) {
    for (XmpProperty& offset : packet.properties({camera, "MicroVideoOffset"}))
      offset.setText(std::to_string(*appended.videoSize + appended.afterVideo));
    return;
  }
  for (const std::string_view local :
       {"MotionPhoto", "MotionPhotoVersion", "MotionPhotoPresentationTimestampUs", "MicroVideo",
        "MicroVideoVersion", "MicroVideoOffset", "MicroVideoPresentationTimestampUs"})
    removeAll(packet, {camera, local});
}

}  // namespace pelorin::photo
