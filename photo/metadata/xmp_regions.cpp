#include "photo/metadata/xmp_regions.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <numbers>
#include <optional>
#include <utility>

#include "image_processing/core/number_text.h"
#include "image_processing/core/parameter_strings.h"

namespace pelorin::photo {
namespace {

// Lists of regions that state what size they were applied to: the Metadata Working Group's, and
// ACDSee's, which has the same shape and two areas to a region: as shown, as found.
struct Dialect {
  std::string_view space, areaFields, sizeFields;
  std::array<std::string_view, 2> areas;  // the first one is the face's

  XmpName regions() const { return {space, "Regions"}; }
};
constexpr Dialect workingGroup = {"http://www.metadataworkinggroup.com/schemas/regions/",
                                  "http://ns.adobe.com/xmp/sType/Area#",
                                  "http://ns.adobe.com/xap/1.0/sType/Dimensions#",
                                  {"Area"}};
constexpr Dialect acdsee = {"http://ns.acdsee.com/regions/",
                            "http://ns.acdsee.com/sType/Area#",
                            "http://ns.acdsee.com/sType/Dimensions#",
                            {"DLYArea", "ALGArea"}};
constexpr const Dialect* dialects[] = {&workingGroup, &acdsee};

constexpr std::string_view appleFace = "http://ns.apple.com/faceinfo/1.0/";
constexpr std::string_view microsoft = "http://ns.microsoft.com/photo/1.2/";
constexpr std::string_view microsoftInfo = "http://ns.microsoft.com/photo/1.2/t/RegionInfo#";
constexpr std::string_view microsoftRegion = "http://ns.microsoft.com/photo/1.2/t/Region#";
constexpr std::string_view iptc = "http://iptc.org/std/Iptc4xmpExt/2008-02-29/";

// Centre and size in fractions of a picture.
struct Area {
  PicturePoint centre;
  double width, height;
};

Area turned(Area area, Turn turn) {
  area.centre = turned(area.centre, turn);
  if (turn.swapsAxes()) std::swap(area.width, area.height);
  return area;
}

std::optional<double> numberOf(const std::string& text) {
  const std::optional<double> number = image_processing::wholeNumber(text);
  return number && std::isfinite(*number) ? number : std::nullopt;
}

// Nine digits: what one minus a fraction of six looks like to a reader.
std::string textOf(double value) {
  return image_processing::roundedText(value, 9);
}

// A number beside its property, where the property is one.
struct Number {
  XmpProperty property;
  std::optional<double> value;

  explicit Number(XmpProperty of) : property(of), value(of ? numberOf(of.text()) : std::nullopt) {}
};

struct Frame {
  PictureSize size;
  Turn turn;  // from that picture to the changed one
};

// How far a region's contents are turned clockwise, where a program says it: in radians beside the
// area, or in degrees among the extensions that a phone writes.
class Roll {
 public:
  explicit Roll(const XmpProperty& region)
      : radians_(region.field({workingGroup.space, "Rotation"})),
        degrees_(extension(region, "AngleInfoRoll")),
        yaw_(extension(region, "AngleInfoYaw")) {}

  // In quarters, the nearest of 0 ... 3.
  std::optional<int> quarters() const {
    const std::optional<double> quarters = radians_.value ? std::optional(*radians_.value / quarter)
                                           : degrees_.value ? std::optional(*degrees_.value / 90)
                                                            : std::nullopt;
    if (!quarters || std::fabs(*quarters) > 1000) return std::nullopt;
    return (static_cast<int>(std::lround(*quarters)) % 4 + 4) % 4;
  }

  void turn(Turn turn) {
    const int sign = turn.mirrored ? -1 : 1;
    if (radians_.value)
      radians_.property.setText(textOf(
          std::remainder(sign * *radians_.value + turn.quarters * quarter, 4 * quarter) + 0.0));
    if (degrees_.value)
      degrees_.property.setText(textOf(positive(sign * *degrees_.value + 90 * turn.quarters)));
    if (yaw_.value && turn.mirrored) yaw_.property.setText(textOf(positive(-*yaw_.value)));
  }

 private:
  static constexpr double quarter = std::numbers::pi / 2;

  static Number extension(const XmpProperty& region, std::string_view name) {
    return Number(region.field({workingGroup.space, "Extensions"}).field({appleFace, name}));
  }
  static double positive(double degrees) {
    const double rest = std::fmod(degrees, 360);
    return (rest < 0 ? rest + 360 : rest) + 0.0;
  }

  Number radians_, degrees_, yaw_;
};

// What regions refer to that were applied to a picture of this size; nothing when that is another
// crop.
// @param storedRoll  whether their contents are turned as the stored picture is.
std::optional<Frame> frameOf(PictureSize applied, bool storedRoll, const PictureChange& change) {
  const Turn upright = uprightTurn(change.orientation);
  const auto hasShape = [&](double width, double height) {
    // Up to a pixel of rounding at either size.
    const double slack = std::max(width, height) + std::max(applied.width, applied.height);
    return std::fabs(applied.width * height - applied.height * width) <= 2 * slack;
  };
  const double width = change.before.width, height = change.before.height;
  if (hasShape(width, height)) return Frame{applied, change.turn};
  if (upright.swapsAxes() && hasShape(height, width)) {
    if (storedRoll) return Frame{{applied.height, applied.width}, change.turn};
    // What is left of the turn behind the upright picture: its quarters beyond upright.
    return Frame{applied, {false, (change.turn.quarters - upright.quarters + 4) % 4}};
  }
  return std::nullopt;
}

// The dimensions that a list of regions states.
struct AppliedTo {
  Number width, height;

  AppliedTo(const XmpProperty& regions, const Dialect& dialect)
      : width(side(regions, dialect, "w")), height(side(regions, dialect, "h")) {}

  std::optional<PictureSize> size() const {
    const auto isSide = [](const Number& side) {
      return side.value && *side.value >= 1 && *side.value <= 1e9;
    };
    if (!isSide(width) || !isSide(height)) return std::nullopt;
    return PictureSize{static_cast<std::uint32_t>(*width.value),
                       static_cast<std::uint32_t>(*height.value)};
  }

 private:
  static Number side(const XmpProperty& regions, const Dialect& dialect, std::string_view name) {
    return Number(
        regions.field({dialect.space, "AppliedToDimensions"}).field({dialect.sizeFields, name}));
  }
};

std::vector<XmpProperty> itemsOf(const XmpProperty& regions, const Dialect& dialect) {
  return regions.field({dialect.space, "RegionList"}).items();
}

// Whether contents are turned as upright ones are in the stored picture.
bool hasStoredRoll(const XmpProperty& regions, const Dialect& dialect, int orientation) {
  const Turn upright = uprightTurn(orientation);
  const int stored = upright.mirrored ? upright.quarters : (4 - upright.quarters) % 4;
  const std::vector<XmpProperty> items = itemsOf(regions, dialect);
  return stored != 0 && std::any_of(items.begin(), items.end(), [&](const XmpProperty& region) {
           return Roll(region).quarters() == stored;
         });
}

std::optional<Frame> frameOf(const XmpProperty& regions, const Dialect& dialect,
                             const PictureChange& change) {
  return frameOf(AppliedTo(regions, dialect).size().value_or(change.before),
                 hasStoredRoll(regions, dialect, change.orientation), change);
}

// Centre and size, normalised unless the unit is pixels.
class AppliedArea {
 public:
  AppliedArea(const XmpProperty& region, const Dialect& dialect, std::string_view name)
      : area_(region.field({dialect.space, name})),
        fields_(dialect.areaFields),
        x_(field("x")),
        y_(field("y")),
        width_(field("w")),
        height_(field("h")),
        diameter_(field("d")),
        inPixels_(area_.field({fields_, "unit"}).text() == "pixel") {}

  std::optional<Area> read(PictureSize frame) const {
    if (!x_.value || !y_.value) return std::nullopt;
    const double across = inPixels_ ? frame.width : 1, down = inPixels_ ? frame.height : 1;
    Area area = {{*x_.value / across, *y_.value / down}, 0, 0};
    if (width_.value && height_.value) {
      area.width = *width_.value / across, area.height = *height_.value / down;
    } else if (diameter_.value) {
      // Of the shorter side.
      const double shorter = std::min(frame.width, frame.height);
      const double pixels = *diameter_.value * (inPixels_ ? 1 : shorter);
      area.width = pixels / frame.width, area.height = pixels / frame.height;
    }
    return area;
  }

  void write(const Area& area, PictureSize frame, PictureSize picture) {
    const double across = inPixels_ ? picture.width : 1, down = inPixels_ ? picture.height : 1;
    x_.property.setText(textOf(area.centre.x * across));
    y_.property.setText(textOf(area.centre.y * down));
    if (width_.value && height_.value) {
      width_.property.setText(textOf(area.width * across));
      height_.property.setText(textOf(area.height * down));
    }
    if (diameter_.value && inPixels_) {
      const double scale = static_cast<double>(std::max(picture.width, picture.height)) /
                           std::max(frame.width, frame.height);
      diameter_.property.setText(textOf(*diameter_.value * scale));
    }
  }

  bool inPixels() const { return inPixels_; }

 private:
  Number field(std::string_view name) const { return Number(area_.field({fields_, name})); }

  XmpProperty area_;
  std::string_view fields_;
  Number x_, y_, width_, height_, diameter_;
  bool inPixels_;
};

bool stays(const Frame& frame, bool inPixels, PictureSize picture) {
  return frame.turn == Turn{} && (!inPixels || frame.size == picture);
}

void turnApplied(const XmpProperty& regions, const Dialect& dialect, const PictureChange& change) {
  const std::optional<Frame> frame = frameOf(regions, dialect, change);
  if (!frame) return;
  for (const XmpProperty& region : itemsOf(regions, dialect)) {
    for (const std::string_view name : dialect.areas) {
      AppliedArea area(region, dialect, name);
      const std::optional<Area> was = area.read(frame->size);
      if (!was || stays(*frame, area.inPixels(), change.after)) continue;
      area.write(turned(*was, frame->turn), frame->size, change.after);
    }
    if (frame->turn != Turn{}) Roll(region).turn(frame->turn);
  }
  AppliedTo applied(regions, dialect);
  if (!applied.size()) return;
  applied.width.property.setText(std::to_string(change.after.width));
  applied.height.property.setText(std::to_string(change.after.height));
}

// Microsoft's: "left, top, width, height", always normalised.
std::optional<Area> readRectangle(const std::string& text) {
  std::array<double, 4> numbers;
  std::size_t at = 0;
  for (std::size_t i = 0; i < numbers.size(); ++i) {
    const std::size_t comma = std::min(text.find(',', at), text.size());
    if ((comma == text.size()) != (i + 1 == numbers.size())) return std::nullopt;
    std::string part = text.substr(at, comma - at);
    part.erase(part.find_last_not_of(' ') + 1);
    const std::optional<double> number = numberOf(part);
    if (!number) return std::nullopt;
    numbers[i] = *number;
    at = comma + 1;
  }
  const auto [left, top, width, height] = numbers;
  return Area{{left + width / 2, top + height / 2}, width, height};
}

std::vector<XmpProperty> microsoftRegions(const XmpPacket& packet) {
  std::vector<XmpProperty> regions;
  for (const XmpProperty& info : packet.properties({microsoft, "RegionInfo"})) {
    const std::vector<XmpProperty> items = info.field({microsoftInfo, "Regions"}).items();
    regions.insert(regions.end(), items.begin(), items.end());
  }
  return regions;
}

// Microsoft's state no size. Programs that write both dialects give them the same meaning.
std::optional<Frame> microsoftFrame(const XmpPacket& packet, const PictureChange& change) {
  const XmpProperty beside = packet.property(workingGroup.regions());
  return beside ? frameOf(beside, workingGroup, change) : frameOf(change.before, false, change);
}

void turnMicrosoft(const XmpPacket& packet, const PictureChange& change) {
  const std::optional<Frame> frame = microsoftFrame(packet, change);
  if (!frame || frame->turn == Turn{}) return;
  for (const XmpProperty& region : microsoftRegions(packet)) {
    XmpProperty rectangle = region.field({microsoftRegion, "Rectangle"});
    if (!rectangle) continue;
    const std::optional<Area> was = readRectangle(rectangle.text());
    if (!was) continue;
    const Area area = turned(*was, frame->turn);
    rectangle.setText(textOf(area.centre.x - area.width / 2) + ", " +
                      textOf(area.centre.y - area.height / 2) + ", " + textOf(area.width) + ", " +
                      textOf(area.height));
  }
}

// IPTC's: a rectangle by its corner, a circle by its centre, a polygon by its corners.
class IptcBoundary {
 public:
  explicit IptcBoundary(const XmpProperty& region)
      : boundary_(region.field({iptc, "RegionBoundary"})),
        inPixels_(boundary_.field({iptc, "rbUnit"}).text() == "pixel") {}

  bool inPixels() const { return inPixels_; }

  void turn(const Frame& frame, PictureSize picture) {
    const std::string shape = boundary_.field({iptc, "rbShape"}).text();
    if (shape == "rectangle") return turnRectangle(frame, picture);
    if (shape == "circle") {
      // Its radius is a fraction of the width.
      Number radius = field("rbRx");
      const double scale =
          inPixels_ ? longer(picture) / longer(frame.size)
                    : longer(picture) / longer(frame.size) * frame.size.width / picture.width;
      if (radius.value) radius.property.setText(textOf(*radius.value * scale));
      return turnPoint(boundary_, frame, picture);
    }
    for (const XmpProperty& vertex : boundary_.field({iptc, "rbVertices"}).items())
      turnPoint(vertex, frame, picture);
  }

 private:
  static double longer(PictureSize size) { return std::max(size.width, size.height); }
  Number field(std::string_view name) const { return Number(boundary_.field({iptc, name})); }

  PicturePoint normalised(double x, double y, PictureSize size) const {
    return inPixels_ ? PicturePoint{x / size.width, y / size.height} : PicturePoint{x, y};
  }
  PicturePoint written(PicturePoint point, PictureSize size) const {
    return inPixels_ ? PicturePoint{point.x * size.width, point.y * size.height} : point;
  }

  void turnPoint(const XmpProperty& holder, const Frame& frame, PictureSize picture) const {
    Number x(holder.field({iptc, "rbX"})), y(holder.field({iptc, "rbY"}));
    if (!x.value || !y.value) return;
    const PicturePoint point =
        written(turned(normalised(*x.value, *y.value, frame.size), frame.turn), picture);
    x.property.setText(textOf(point.x));
    y.property.setText(textOf(point.y));
  }

  void turnRectangle(const Frame& frame, PictureSize picture) {
    Number x = field("rbX"), y = field("rbY"), width = field("rbW"), height = field("rbH");
    if (!x.value || !y.value || !width.value || !height.value) return;
    const PicturePoint corner = normalised(*x.value, *y.value, frame.size);
    const PicturePoint extent = normalised(*width.value, *height.value, frame.size);
    const Area area = turned(
        Area{{corner.x + extent.x / 2, corner.y + extent.y / 2}, extent.x, extent.y}, frame.turn);
    const PicturePoint newCorner =
        written({area.centre.x - area.width / 2, area.centre.y - area.height / 2}, picture);
    const PicturePoint newExtent = written({area.width, area.height}, picture);
    x.property.setText(textOf(newCorner.x));
    y.property.setText(textOf(newCorner.y));
    width.property.setText(textOf(newExtent.x));
    height.property.setText(textOf(newExtent.y));
  }

  XmpProperty boundary_;
  bool inPixels_;
};

// A name that was found and then denied belongs to no face there, or to none at all.
bool isFace(const XmpProperty& region, const Dialect& dialect) {
  const std::string type = region.field({dialect.space, "Type"}).text();
  return (type.empty() || type == "Face" || type == "face") &&
         region.field({dialect.space, "NameAssignType"}).text() != "denied";
}

// As shown, or as found where it is not.
std::optional<Area> faceArea(const XmpProperty& region, const Dialect& dialect, PictureSize frame) {
  for (const std::string_view name : dialect.areas) {
    if (const std::optional<Area> area = AppliedArea(region, dialect, name).read(frame))
      return area;
  }
  return std::nullopt;
}

KnownFace faceAt(const Area& area, std::string name) {
  return {area.centre.x - area.width / 2, area.centre.y - area.height / 2,
          area.centre.x + area.width / 2, area.centre.y + area.height / 2, std::move(name)};
}

// Share of the two that both cover.
double overlap(const KnownFace& a, const KnownFace& b) {
  const double across = std::min(a.right, b.right) - std::max(a.left, b.left);
  const double down = std::min(a.bottom, b.bottom) - std::max(a.top, b.top);
  if (across <= 0 || down <= 0) return 0;
  const double both = (a.right - a.left) * (a.bottom - a.top) +
                      (b.right - b.left) * (b.bottom - b.top) - across * down;
  return across * down / both;
}

void addOnce(std::vector<KnownFace>& faces, KnownFace face) {
  if (!(face.right > face.left) || !(face.bottom > face.top)) return;
  for (KnownFace& known : faces) {
    if (overlap(known, face) <= 0.5) continue;
    if (known.name.empty()) known.name = face.name;
    return;
  }
  faces.push_back(std::move(face));
}

}  // namespace

void turnRegions(XmpPacket& packet, const PictureChange& change) {
  turnMicrosoft(packet, change);  // first: it reads what the others refer to
  for (const Dialect* dialect : dialects) {
    for (const XmpProperty& regions : packet.properties(dialect->regions()))
      turnApplied(regions, *dialect, change);
  }
  const Frame stored = {change.before, change.turn};
  for (const XmpProperty& regions : packet.properties({iptc, "ImageRegion"})) {
    for (const XmpProperty& region : regions.items()) {
      IptcBoundary boundary(region);
      if (!stays(stored, boundary.inPixels(), change.after)) boundary.turn(stored, change.after);
    }
  }
}

std::vector<KnownFace> facesOf(const XmpPacket& packet, const PictureChange& change) {
  std::vector<KnownFace> faces;
  for (const Dialect* dialect : dialects) {
    for (const XmpProperty& regions : packet.properties(dialect->regions())) {
      const std::optional<Frame> frame = frameOf(regions, *dialect, change);
      if (!frame) continue;
      for (const XmpProperty& region : itemsOf(regions, *dialect)) {
        const std::optional<Area> area = faceArea(region, *dialect, frame->size);
        if (!area || !isFace(region, *dialect)) continue;
        addOnce(faces,
                faceAt(turned(*area, frame->turn), region.field({dialect->space, "Name"}).text()));
      }
    }
  }
  const std::optional<Frame> frame = microsoftFrame(packet, change);
  for (const XmpProperty& region : microsoftRegions(packet)) {
    const std::optional<Area> area =
        readRectangle(region.field({microsoftRegion, "Rectangle"}).text());
    if (!area || !frame) continue;
    addOnce(faces, faceAt(turned(*area, frame->turn),
                          region.field({microsoftRegion, "PersonDisplayName"}).text()));
  }
  return faces;
}

}  // namespace pelorin::photo
