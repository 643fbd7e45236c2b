#pragma once

#include <string>

namespace pelorin::test_support {

/// A packet of XMP with these children of rdf:RDF; every prefix that tests use is declared.
/// @param padding  spaces before the closing instruction.
inline std::string xmpPacket(const std::string& descriptions, std::size_t padding = 0) {
  return "<?xpacket begin=\"\xEF\xBB\xBF\" id=\"W5M0MpCehiHzreSzNTczkc9d\"?>\n"
         "<x:xmpmeta xmlns:x=\"adobe:ns:meta/\" x:xmptk=\"a toolkit\">\n"
         " <rdf:RDF xmlns:rdf=\"http://www.w3.org/1999/02/22-rdf-syntax-ns#\"\n"
         "   xmlns:tiff=\"http://ns.adobe.com/tiff/1.0/\""
         " xmlns:exif=\"http://ns.adobe.com/exif/1.0/\"\n"
         "   xmlns:xmp=\"http://ns.adobe.com/xap/1.0/\""
         " xmlns:xmpNote=\"http://ns.adobe.com/xmp/note/\"\n"
         "   xmlns:mwg-rs=\"http://www.metadataworkinggroup.com/schemas/regions/\"\n"
         "   xmlns:stArea=\"http://ns.adobe.com/xmp/sType/Area#\""
         " xmlns:stDim=\"http://ns.adobe.com/xap/1.0/sType/Dimensions#\"\n"
         "   xmlns:MP=\"http://ns.microsoft.com/photo/1.2/\""
         " xmlns:MPRI=\"http://ns.microsoft.com/photo/1.2/t/RegionInfo#\"\n"
         "   xmlns:MPReg=\"http://ns.microsoft.com/photo/1.2/t/Region#\"\n"
         "   xmlns:Iptc4xmpExt=\"http://iptc.org/std/Iptc4xmpExt/2008-02-29/\"\n"
         "   xmlns:acdsee-rs=\"http://ns.acdsee.com/regions/\""
         " xmlns:acdsee-stArea=\"http://ns.acdsee.com/sType/Area#\"\n"
         "   xmlns:acdsee-stDim=\"http://ns.acdsee.com/sType/Dimensions#\""
         " xmlns:apple-fi=\"http://ns.apple.com/faceinfo/1.0/\"\n"
         "   xmlns:my=\"urn:something:unknown\">\n" +
         descriptions + "\n </rdf:RDF>\n</x:xmpmeta>" +
         std::string(padding > 0 ? 1 : 0, '\n').append(padding > 0 ? padding - 1 : 0, ' ') +
         "<?xpacket end=\"w\"?>";
}

}  // namespace pelorin::test_support
