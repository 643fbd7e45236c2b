// Bytes as the XMP of a JPEG file, bare and within a packet that could be one: reading and editing are
// safe, what is written can be read again and states the picture, and of what is merged no extension
// is left.
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

#include "fuzz/damage.h"
#include "photo/metadata/xmp_container.h"
#include "photo/metadata/xmp_facts.h"
#include "photo/metadata/xmp_regions.h"
#include "photo/metadata/xmp_segments.h"

namespace {

using namespace pelorin::photo;

const std::string packetMark("http://ns.adobe.com/xap/1.0/\0", 29);
constexpr PictureChange change = {{40, 30}, {15, 20}, {false, 1}, 6};

MetadataSegment segmentOf(const std::string& text) {
  return {0xE1, {text.begin(), text.end()}};
}

void edit(std::vector<MetadataSegment> segments) {
  std::vector<Loss> lost;
  const auto state = [&](XmpPacket& packet) {
    facesOf(packet, change);
    stateFacts(packet, change, lost);
    turnRegions(packet, change);
    stateAppended(packet, {.gainMapSize = 7, .videoSize = {}});
  };
  editXmp(segments, state, lost);
  std::vector<Loss> lostAgain;
  editXmp(
      segments,
      [](XmpPacket& packet) {
        for (const XmpProperty& property :
             packet.properties({"http://ns.adobe.com/tiff/1.0/", "Orientation"})) {
          if (property.text() != "1") std::abort();
        }
      },
      lostAgain);
  if (!lostAgain.empty()) std::abort();
  for (const MetadataSegment& segment : segments) {
    if (segment.payload.size() > 65533) std::abort();
  }
}

void merge(std::vector<MetadataSegment> segments) {
  std::vector<Loss> lost;
  mergeXmpExtensions(segments, lost);
  bool claimsExtension = false;
  std::vector<Loss> lostAgain;
  editXmp(
      segments,
      [&](const XmpPacket& packet) {
        claimsExtension =
            claimsExtension || packet.property({"http://ns.adobe.com/xmp/note/", "HasExtendedXMP"});
      },
      lostAgain);
  if (claimsExtension || !lostAgain.empty()) std::abort();
}

// Bytes as all of an extension.
std::string extensionOf(const std::string& packet, const std::string& name) {
  std::string segment("http://ns.adobe.com/xmp/extension/\0", 35);
  segment += name;
  for (const std::size_t number : {packet.size(), std::size_t{0}}) {
    for (int shift = 24; shift >= 0; shift -= 8)
      segment += static_cast<char>(number >> shift & 255);
  }
  return segment + packet;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string bytes(data, data + size);
  edit({segmentOf(packetMark + bytes)});
  const std::string name = "0123456789ABCDEF0123456789ABCDEF";
  const auto packetOf = [&](const std::string& content) {
    return "<x:xmpmeta xmlns:x='adobe:ns:meta/'><rdf:RDF "
           "xmlns:rdf='http://www.w3.org/1999/02/22-rdf-syntax-ns#' "
           "xmlns:tiff='http://ns.adobe.com/tiff/1.0/' xmlns:n='http://ns.adobe.com/xmp/note/' "
           "xmlns:mwg-rs='http://www.metadataworkinggroup.com/schemas/regions/' "
           "xmlns:stArea='http://ns.adobe.com/xmp/sType/Area#'><rdf:Description "
           "tiff:Orientation='6' n:HasExtendedXMP='" +
           name + "'>" + content + "</rdf:Description></rdf:RDF></x:xmpmeta>";
  };
  const std::string good = packetOf(
      "<mwg-rs:Regions><mwg-rs:RegionList><rdf:Bag><rdf:li mwg-rs:Type='Face'><mwg-rs:Area "
      "stArea:x='0.5' stArea:y='0.5' stArea:w='0.1' stArea:h='0.1'/></rdf:li></rdf:Bag>"
      "</mwg-rs:RegionList></mwg-rs:Regions>");
  const std::string bad = damaged(good, {data, data + size});
  for (const std::string& packet : {packetOf(bytes), good, bad}) {
    for (const std::string& extension : {bytes, bad}) {
      const std::vector<MetadataSegment> segments = {segmentOf(packetMark + packet),
                                                     segmentOf(extensionOf(extension, name))};
      edit(segments);
      merge(segments);
    }
  }
  return 0;
}
