#include "cli/frame/face_choice.h"

namespace pelorin::cli {

void addFaceOptions(Verb verb, FaceOptions& options) {
  verb.option("--face", options.given,
              "A face as left,top,right,bottom of the upright picture, in fractions (0,0 its top "
              "left corner, 1,1 the opposite one) or, when a number is above 2, in pixels of its "
              "full size; may be repeated")
      .oneValueEach()
      .type("L,T,R,B");
  verb.option("--faces", options.source,
              "Use the faces that the photo's XMP knows of (xmp, unless given), none, or those of "
              "a JSON file: {\"faces\": [{\"left\": 0.4, \"top\": 0.1, \"right\": 0.6, "
              "\"bottom\": 0.4}]}, or what info --json prints. --face adds to them")
      .type("xmp|none|FILE");
}

FaceChoice::FaceChoice(const FaceOptions& options)
    : given_(readFaces(options.given)), asksPhoto_(options.source == "xmp") {
  if (!asksPhoto_ && options.source != "none") file_ = readFaceFile(options.source);
}

std::vector<Face> FaceChoice::of(const Input& input) const {
  std::vector<Face> faces = given_;
  if (!file_) return faces;
  const std::vector<Face>& more = file_->of(input.path);
  faces.insert(faces.end(), more.begin(), more.end());
  return faces;
}

}  // namespace pelorin::cli
