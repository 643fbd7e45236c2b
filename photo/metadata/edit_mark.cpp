#include "photo/metadata/edit_mark.h"

#include <algorithm>
#include <string_view>

#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/segments.h"
#include "photo/metadata/xmp_packet.h"
#include "photo/metadata/xmp_segments.h"

namespace pelorin::photo {
namespace {

constexpr std::uint8_t app0 = 0xE0, app1 = 0xE1;
constexpr std::string_view agent = "Quenby ";
constexpr XmpName history = {"http://ns.adobe.com/xap/1.0/mm/", "History"};
constexpr std::string_view eventFields = "http://ns.adobe.com/xap/1.0/sType/ResourceEvent#";

std::vector<XmpField> fieldsOf(const EditMark& mark) {
  std::vector<XmpField> fields = {
      {"action", "edited"},
      {"softwareAgent", std::string(agent) + mark.version},
      {"parameters", mark.params.empty() ? mark.filter : mark.filter + " " + mark.params}};
  if (!mark.when.empty()) fields.push_back({"when", mark.when});
  return fields;
}

// Behind JFIF and Exif, which both want to be first.
std::vector<MetadataSegment>::iterator placeOfPacket(std::vector<MetadataSegment>& segments) {
  return std::find_if(segments.begin(), segments.end(), [](const MetadataSegment& segment) {
    return segment.marker != app0 && !(segment.marker == app1 && isExif(segment.payload));
  });
}

// Whether a packet may tell of it at all; what is spread over several segments may.
bool mayTell(const MetadataSegment& segment) {
  if (segment.marker != app1 || isExif(segment.payload)) return false;
  const auto& bytes = segment.payload;
  return isXmpExtension(segment) ||
         std::search(bytes.begin(), bytes.end(), agent.begin(), agent.end()) != bytes.end();
}

}  // namespace

void addEditMark(std::vector<MetadataSegment>& segments, const EditMark& mark,
                 std::vector<Loss>& lost) {
  bool done = false;
  const auto addTo = [&](XmpPacket& packet) {
    packet.append(history, "xmpMM", {eventFields, "stEvt", fieldsOf(mark)});
    done = true;
  };
  // The history may stand in an extension, which comes after its packet.
  editXmp(
      segments,
      [&](XmpPacket& packet) {
        if (!done && packet.property(history)) addTo(packet);
      },
      lost);
  if (done) return;
  editXmp(
      segments,
      [&](XmpPacket& packet) {
        if (!done) addTo(packet);
      },
      lost);
  if (done) return;
  XmpPacket packet = XmpPacket::ofItsOwn();
  addTo(packet);
  const std::string bytes = packet.bytes();
  segments.insert(placeOfPacket(segments),
                  segmentOf(app1, xmpMark,
                            {reinterpret_cast<const std::uint8_t*>(bytes.data()), bytes.size()}));
}

std::vector<EditMark> editMarksOf(std::span<const MetadataSegment> segments) {
  std::vector<EditMark> marks;
  if (std::none_of(segments.begin(), segments.end(), mayTell)) return marks;
  std::vector<MetadataSegment> unchanged(segments.begin(), segments.end());
  std::vector<Loss> unreadable;
  editXmp(
      unchanged,
      [&](const XmpPacket& packet) {
        for (const XmpProperty& list : packet.properties(history)) {
          for (const XmpProperty& event : list.items()) {
            const auto text = [&](std::string_view local) {
              return event.field({eventFields, local}).text();
            };
            const std::string software = text("softwareAgent");
            if (!software.starts_with(agent)) continue;
            const std::string parameters = text("parameters");
            const std::size_t space = std::min(parameters.find(' '), parameters.size());
            marks.push_back({software.substr(agent.size()), parameters.substr(0, space),
                             parameters.substr(std::min(space + 1, parameters.size())),
                             text("when")});
          }
        }
      },
      unreadable);
  return marks;
}

std::string textOf(const EditMark& mark) {
  std::string text = mark.filter;
  for (std::string_view rest = mark.params; !rest.empty();) {
    const std::size_t end = std::min(rest.find(';'), rest.size());
    std::string item(rest.substr(0, end));
    rest.remove_prefix(std::min(end + 1, rest.size()));
    if (item.empty()) continue;
    std::replace(item.begin(), item.end(), '=', ' ');
    text += ", ";
    text += item;
  }
  return text;
}

}  // namespace pelorin::photo
