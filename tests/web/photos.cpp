// photos FOLDER: twenty photos as cameras and other programs write them, for a comparison of front ends,
// a large one, near-duplicates and files that are none.
#include <filesystem>
#include <fstream>
#include <string>

#include "tests/photo/metadata/phone_photos.h"
#include "tests/photo/metadata/xmp_texts.h"
#include "tests/support/exif_payload.h"
#include "tests/support/jpeg_files.h"
#include "tests/support/print_profile.h"

using namespace pelorin;
using namespace pelorin::test_support;

namespace {

photo::MetadataSegment taken(int orientation, const std::string& when = "2024:05:01 12:30:45") {
  ExifFields fields;
  fields.orientation = orientation;
  fields.dateTime = when;
  fields.offset = "+02:00";
  return {0xE1, exifPayload(fields, true)};
}

const char* const faces =
    "<rdf:Description xmlns:mwg-rs='http://www.metadataworkinggroup.com/schemas/regions/' "
    "xmlns:stDim='http://ns.adobe.com/xap/1.0/sType/Dimensions#' "
    "xmlns:stArea='http://ns.adobe.com/xmp/sType/Area#'>"
    "<mwg-rs:Regions rdf:parseType='Resource'><mwg-rs:AppliedToDimensions stDim:w='640' "
    "stDim:h='480' "
    "stDim:unit='pixel'/><mwg-rs:RegionList><rdf:Bag><rdf:li rdf:parseType='Resource'>"
    "<mwg-rs:Type>Face</mwg-rs:Type><mwg-rs:Name>Ada</mwg-rs:Name><mwg-rs:Area stArea:x='0.4' "
    "stArea:y='0.35' stArea:w='0.2' stArea:h='0.3' stArea:unit='normalized'/></rdf:li></rdf:Bag>"
    "</mwg-rs:RegionList></mwg-rs:Regions></rdf:Description>";

}  // namespace

int main(int, char** argv) {
  const std::filesystem::path folder = argv[1];
  const auto write = [&](const std::string& name, const Bytes& bytes) {
    std::filesystem::create_directories((folder / name).parent_path());
    std::ofstream(folder / name, std::ios::binary)
        .write(reinterpret_cast<const char*>(bytes.data()),
               static_cast<std::streamsize>(bytes.size()));
  };
  const auto picture = photoLikePicture(331, 247, 5);

  for (int orientation = 1; orientation <= 8; ++orientation) {
    write("twenty/orientation" + std::to_string(orientation) + ".jpg",
          jpegOf(picture, {taken(orientation)}));
  }
  const auto recipe = [](J_COLOR_SPACE samples, J_COLOR_SPACE stored) {
    JpegRecipe made;
    made.width = 203;
    made.height = 150;
    made.samples = samples;
    made.stored = stored;
    return made;
  };
  JpegRecipe other = recipe(JCS_RGB, JCS_YCbCr);
  write("twenty/plain.jpg", makeJpeg(other));
  other.scans = completeProgressiveScans();
  other.metadata = {taken(6), {0xFE, bytesOf("A comment")}};
  write("twenty/progressive.jpg", makeJpeg(other));
  other = recipe(JCS_RGB, JCS_YCbCr);
  other.horizontalSampling = other.verticalSampling = 1;
  other.quality = 97;
  write("twenty/full_colour.jpg", makeJpeg(other));
  other.horizontalSampling = 2;
  other.restartInterval = 3;
  write("twenty/restarts.jpg", makeJpeg(other));
  write("twenty/rgb.jpg", makeJpeg(recipe(JCS_RGB, JCS_RGB)));
  write("twenty/grey.jpg", makeJpeg(recipe(JCS_GRAYSCALE, JCS_GRAYSCALE)));
  write("twenty/cmyk.jpg", makeJpeg(recipe(JCS_CMYK, JCS_CMYK)));
  write("twenty/ycck.jpg", makeJpeg(recipe(JCS_CMYK, JCS_YCCK)));
  for (const double version : {2.1, 4.2}) {
    JpegRecipe printed = recipe(JCS_CMYK, JCS_YCCK);
    printed.profile = profileOfSwappedInks(version);
    const std::string name = "twenty/profile" + std::to_string(static_cast<int>(version));
    write(name + ".jpg", makeJpeg(printed));
    printed.profile = profileOfSwappedInks(version, 0.2);
    write(name + "_pale_black.jpg", makeJpeg(printed));
  }
  const auto portrait = photoLikePicture(640, 480, 8);
  write("twenty/faces.jpg", jpegOf(portrait, {taken(1), xmpSegment(xmpPacket(faces))}));
  write("twenty/phone.jpg", phonePhoto(6, joined({gainMap(), video()})));
  write("twenty/thin.jpg", jpegOf(photoLikePicture(801, 3, 2)));
  write("twenty/one.jpg", jpegOf(photoLikePicture(1, 1, 2)));

  // Two shots of one scene a moment apart, and another.
  write("similar/a.jpg", jpegOf(portrait, {taken(1, "2023:05:01 12:30:45")}));
  write("similar/b.jpg", jpegOf(portrait, {taken(1, "2023:05:01 12:30:47")}, 80));
  write("similar/c.jpg", jpegOf(noisePicture(320, 240, 4), {taken(1, "2021:01:01 08:00:00")}));

  write("large.jpg", jpegOf(photoLikePicture(2000, 1500, 3), {taken(1, "2020:02:03 10:00:00")}));

  write("hundred.jpg", jpegOf(photoLikePicture(11600, 8640, 4), {}, 75));

  const Bytes whole = jpegOf(picture);
  write("hostile/empty.jpg", {});
  write("hostile/cut.jpg",
        Bytes(whole.begin(), whole.begin() + static_cast<std::ptrdiff_t>(whole.size() / 2)));
  write("hostile/bomb.jpg", withSize(whole, 65500, 65500));
  write("hostile/text.jpg", bytesOf("This is no photo."));
  write("hostile/page.png", bytesOf("<script>document.title = 'broken'</script>"));
}
