#include "cli/frame/face_file.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <filesystem>
#include <nlohmann/json.hpp>
#include <system_error>

#include "cli/frame/errors.h"
#include "photo/file_io.h"

namespace pelorin::cli {
namespace {

using ReadJson = nlohmann::json;

// A place in a file, for messages: "--faces: FILE: [2].faces[0]: ...".
class Place {
 public:
  explicit Place(std::string file) : file_(std::move(file)) {}

  Place at(const std::string& key, std::size_t index) const {
    Place place(file_);
    place.within_ = within_ + (within_.empty() || key.empty() ? "" : ".") + key + "[" +
                    std::to_string(index) + "]";
    return place;
  }
  [[noreturn]] void refuse(const std::string& reason) const {
    throw UsageError("--faces: " + file_ + ": " + (within_.empty() ? "" : within_ + ": ") + reason);
  }

 private:
  std::string file_, within_;
};

Face readFace(const ReadJson& json, const Place& place) {
  if (!json.is_object()) place.refuse("is no object with left, top, right and bottom");
  constexpr std::array<const char*, 4> bounds = {"left", "top", "right", "bottom"};
  std::array<float, 4> values;
  for (std::size_t i = 0; i < bounds.size(); ++i) {
    const auto found = json.find(bounds[i]);
    if (found == json.end()) place.refuse(std::string("has no '") + bounds[i] + "'");
    if (!found->is_number()) place.refuse(std::string("'") + bounds[i] + "' is no number");
    values[i] = found->get<float>();
    if (!(std::fabs(values[i]) <= largestFaceFraction)) {
      place.refuse(std::string("'") + bounds[i] + "' is no fraction of the picture, from 0 to 1");
    }
  }
  for (const auto& [key, value] : json.items()) {
    const bool known = key == "name" || std::ranges::find(bounds, key) != bounds.end();
    if (!known) place.refuse("has '" + key + "', which is none of left, top, right, bottom, name");
  }
  const Face face = {values[0], values[1], values[2], values[3], false};
  const std::string wrong = whatIsWrongWith(face);
  if (!wrong.empty()) place.refuse(wrong);
  return face;
}

std::vector<Face> readFaces(const ReadJson& json, const Place& place) {
  if (!json.is_object() || !json.contains("faces") || !json["faces"].is_array())
    place.refuse("is no object with a list of \"faces\"");
  std::vector<Face> faces;
  for (const ReadJson& face : json["faces"])
    faces.push_back(readFace(face, place.at("faces", faces.size())));
  return faces;
}

std::string normalised(const std::string& path) {
  return std::filesystem::path(path).lexically_normal().string();
}

ReadJson parsed(const std::string& path, const Place& place) {
  try {
    const std::vector<std::uint8_t> bytes = photo::readFile(path);
    return ReadJson::parse(bytes);
  } catch (const std::system_error& error) {
    throw UsageError(
        "--faces: '" + path +
        "' is neither xmp nor none nor a file that can be read: " + error.code().message());
  } catch (const ReadJson::parse_error& error) {
    place.refuse("is no JSON at byte " + std::to_string(error.byte));
  } catch (const ReadJson::exception&) {
    place.refuse("has a number that is too large");
  }
}

}  // namespace

const std::vector<Face>& FaceFile::of(const std::string& photo) const {
  if (!isList) return ofEveryPhoto;
  const auto found = ofPhotos.find(normalised(photo));
  if (found == ofPhotos.end()) throw FileError("--faces: " + path + " has no entry for this photo");
  return found->second;
}

FaceFile readFaceFile(const std::string& path) {
  const Place place(path);
  const ReadJson json = parsed(path, place);
  FaceFile file{path, json.is_array(), {}, {}};
  if (!file.isList) {
    file.ofEveryPhoto = readFaces(json, place);
    return file;
  }
  for (std::size_t i = 0; i < json.size(); ++i) {
    const Place entry = place.at("", i);
    std::vector<Face> faces = readFaces(json[i], entry);
    if (!json[i].contains("file") || !json[i]["file"].is_string())
      entry.refuse("does not say which \"file\" it is about");
    if (!file.ofPhotos.emplace(normalised(json[i]["file"]), std::move(faces)).second)
      entry.refuse("is about a file that an entry before it is about");
  }
  return file;
}

}  // namespace pelorin::cli
