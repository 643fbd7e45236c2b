#include "tests/photo/metadata/phone_photos.h"

#include "photo/jpeg/jpeg_codec.h"
#include "photo/metadata/mpf.h"
#include "tests/photo/metadata/xmp_texts.h"
#include "tests/support/pictures.h"

namespace pelorin::test_support {

using namespace std::string_literals;
using photo::MetadataSegment;
using photo::MpfEntry;
using photo::mpfPrimary;
using photo::writeMpf;

namespace {

const std::string gainMapXmp =
    "<rdf:Description xmlns:hdrgm='http://ns.adobe.com/hdr-gain-map/1.0/' hdrgm:Version='1.0' "
    "hdrgm:GainMapMax='2.5'/>";
const std::string container =
    "<rdf:Description xmlns:hdrgm='http://ns.adobe.com/hdr-gain-map/1.0/' "
    "xmlns:Container='http://ns.google.com/photos/1.0/container/' "
    "xmlns:Item='http://ns.google.com/photos/1.0/container/item/' "
    "xmlns:GCamera='http://ns.google.com/photos/1.0/camera/' hdrgm:Version='1.0' "
    "GCamera:MotionPhoto='1'><Container:Directory><rdf:Seq>"
    "<rdf:li rdf:parseType='Resource'><Container:Item Item:Semantic='Primary' "
    "Item:Mime='image/jpeg'/></rdf:li>"
    "<rdf:li rdf:parseType='Resource'><Container:Item Item:Semantic='GainMap' "
    "Item:Mime='image/jpeg' Item:Length='7'/></rdf:li>"
    "<rdf:li rdf:parseType='Resource'><Container:Item Item:Semantic='MotionPhoto' "
    "Item:Mime='video/mp4' Item:Length='8'/></rdf:li>"
    "</rdf:Seq></Container:Directory></rdf:Description>";

}  // namespace

Bytes jpegWith(const Image<RGBA8Pixel>& picture, const std::vector<MetadataSegment>& segments) {
  return photo::encodeJpeg(reinterpret_cast<const std::uint8_t*>(picture.data.get()), picture.width,
                           picture.height, 90, segments);
}

MetadataSegment xmpSegment(const std::string& text) {
  return {0xE1, bytesOf("http://ns.adobe.com/xap/1.0/\0"s + text)};
}

Bytes joined(std::initializer_list<Bytes> parts) {
  Bytes all;
  for (const Bytes& part : parts) all.insert(all.end(), part.begin(), part.end());
  return all;
}

Bytes gainMap(bool iso) {
  const MetadataSegment mark =
      iso ? MetadataSegment{0xE2, bytesOf("urn:iso:std:iso:ts:21496:-1\0payload"s)}
          : xmpSegment(xmpPacket(gainMapXmp));
  return jpegWith(photoLikePicture(32, 64, 5), {mark});
}

Bytes video() {
  return bytesOf("\0\0\0\x10"s + "ftypmp42\0\0\0\0"s + "\0\0\0\x0C"s + "mdat" + "film");
}

Bytes phonePhoto(int orientation, const Bytes& tail) {
  return joined(
      {jpegWith(photoLikePicture(64, 128, 1),
                {{0xE1, cameraExif({.orientation = orientation, .width = 64, .height = 128})},
                 xmpSegment(xmpPacket(container)),
                 {0xE2, writeMpf(std::vector<MpfEntry>{{mpfPrimary, 1, 0}, {0, 2, 3}})},
                 {0xE2, bytesOf("urn:iso:std:iso:ts:21496:-1\0\0\0\0\0"s)}}),
       tail});
}

}  // namespace pelorin::test_support
