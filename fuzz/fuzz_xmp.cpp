// Bytes as the XMP of a JPEG file, bare and within a packet that could be one: reading and editing are
// safe, and what is written can be read again and states the picture.
#include <cstdint>
#include <cstdlib>
#include <string>
#include <vector>

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

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const std::string bytes(data, data + size);
  edit({segmentOf(packetMark + bytes)});
  const std::string whole =
      "<x:xmpmeta xmlns:x='adobe:ns:meta/'><rdf:RDF "
      "xmlns:rdf='http://www.w3.org/1999/02/22-rdf-syntax-ns#' "
      "xmlns:tiff='http://ns.adobe.com/tiff/1.0/' xmlns:n='http://ns.adobe.com/xmp/note/' "
      "xmlns:mwg-rs='http://www.metadataworkinggroup.com/schemas/regions/' "
      "xmlns:stArea='http://ns.adobe.com/xmp/sType/Area#'><rdf:Description tiff:Orientation='6' "
      "n:HasExtendedXMP='0123456789ABCDEF0123456789ABCDEF'>" +
      bytes + "</rdf:Description></rdf:RDF></x:xmpmeta>";
  edit({segmentOf(packetMark + whole),
        segmentOf(std::string("http://ns.adobe.com/xmp/extension/\0", 35) +
                  "0123456789ABCDEF0123456789ABCDEF" + bytes)});
  return 0;
}
