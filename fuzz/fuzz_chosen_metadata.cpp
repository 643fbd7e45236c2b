// Bytes as segments of each kind, bare and as damage to good ones: choosing among metadata is safe,
// chooses nothing but what was asked for, and what was chosen is chosen again.
#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "fuzz/damage.h"
#include "photo/metadata/chosen_metadata.h"
#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/photoshop_resources.h"
#include "photo/metadata/segments.h"

namespace {

using namespace pelorin::photo;
using namespace std::string_literals;
using Bytes = std::vector<std::uint8_t>;

constexpr std::uint8_t app1 = 0xE1, app13 = 0xED;

// Artist and Copyright, each with a value elsewhere.
const std::string exif =
    "Exif\0\0II*\0\x08\0\0\0\2\0\x3B\1\2\0\x05\0\0\0\x26\0\0\0\x98\x82\2\0\x06\0\0\0\x2B\0\0\0"
    "\0\0\0\0Adam\0Adams\0"s;
const std::string xmp =
    "http://ns.adobe.com/xap/1.0/\0"s
    "<x:xmpmeta xmlns:x='adobe:ns:meta/'><rdf:RDF "
    "xmlns:rdf='http://www.w3.org/1999/02/22-rdf-syntax-ns#' "
    "xmlns:dc='http://purl.org/dc/elements/1.1/' xmlns:my='urn:something'><rdf:Description "
    "my:Thing='1'><dc:creator><rdf:Seq><rdf:li>Ada</rdf:li></rdf:Seq></dc:creator>"
    "</rdf:Description></rdf:RDF></x:xmpmeta>";
// By-line and a caption.
const std::string iptc =
    "Photoshop 3.0\0"s
    "8BIM\x04\x04\0\0\0\0\0\x12\x1C\2\x50\0\3Ada\x1C\2\x78\0\x05hello"s;

Bytes bytesOf(const std::string& text) {
  return {text.begin(), text.end()};
}

Bytes headed(std::string_view head, const Bytes& content) {
  Bytes bytes(head.begin(), head.end());
  bytes.insert(bytes.end(), content.begin(), content.end());
  return bytes;
}

bool isSame(const std::vector<MetadataSegment>& a, const std::vector<MetadataSegment>& b) {
  return std::equal(a.begin(), a.end(), b.begin(), b.end(), [](const auto& x, const auto& y) {
    return x.marker == y.marker && x.payload == y.payload;
  });
}

void choose(const Metadata& metadata) {
  using Kind = MetadataKind;
  if (!chosenMetadata(metadata, {}).segments.empty()) std::abort();
  for (const std::set<Kind>& kinds :
       {std::set{Kind::copyright}, std::set{Kind::time}, std::set{Kind::exif, Kind::copyright},
        std::set{Kind::xmp}, std::set{Kind::iptc}, std::set{Kind::gainMap}}) {
    const Metadata chosen = chosenMetadata(metadata, kinds);
    if (chosen.segments.size() > metadata.segments.size()) std::abort();
    if (!isSame(chosenMetadata(chosen, kinds).segments, chosen.segments)) std::abort();
    for (const MetadataSegment& segment : chosen.segments) {
      const bool isOfXmp = segment.marker == app1 && !isExif(segment.payload);
      if (isOfXmp && kinds.contains(Kind::iptc)) std::abort();
      if (isPhotoshopResources(segment) && kinds.contains(Kind::xmp)) std::abort();
    }
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  const Bytes bytes(data, data + size);
  choose({.segments = {{app1, bytesOf(damaged(exif, bytes))},
                       {app1, bytesOf(damaged(xmp, bytes))},
                       {app13, bytesOf(damaged(iptc, bytes))}}});
  choose({.segments = {{app1, headed("Exif\0\0II*\0\x08\0\0\0"s, bytes)},
                       {app1, headed("http://ns.adobe.com/xap/1.0/\0"s, bytes)},
                       {app13, headed("Photoshop 3.0\0"s
                                      "8BIM\x04\x04\0\0\0\0"s,
                                      bytes)}},
          .tail = bytes});
  return 0;
}
