#include "photo/metadata/xmp_facts.h"

#include <string>

namespace pelorin::photo {
namespace {

constexpr std::string_view tiff = "http://ns.adobe.com/tiff/1.0/";
constexpr std::string_view exif = "http://ns.adobe.com/exif/1.0/";
constexpr std::string_view basic = "http://ns.adobe.com/xap/1.0/";

void state(XmpPacket& packet, XmpName name, std::uint32_t value) {
  for (XmpProperty& property : packet.properties(name)) property.setText(std::to_string(value));
}

}  // namespace

void stateFacts(XmpPacket& packet, const PictureChange& change, std::vector<Loss>& lost) {
  state(packet, {tiff, "Orientation"}, 1);
  state(packet, {tiff, "ImageWidth"}, change.after.width);
  state(packet, {tiff, "ImageLength"}, change.after.height);
  state(packet, {exif, "PixelXDimension"}, change.after.width);
  state(packet, {exif, "PixelYDimension"}, change.after.height);
  for (XmpProperty& thumbnails : packet.properties({basic, "Thumbnails"})) {
    thumbnails.remove();
    lost.push_back({"XMP thumbnail", "shows the picture as it was"});
  }
}

}  // namespace pelorin::photo
