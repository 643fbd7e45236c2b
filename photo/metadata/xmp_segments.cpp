#include "photo/metadata/xmp_segments.h"

#include <algorithm>
#include <map>
#include <optional>
#include <string>
#include <utility>

#include "photo/metadata/md5.h"

namespace pelorin::photo {
namespace {

using namespace std::string_view_literals;

constexpr std::uint8_t app1 = 0xE1;
constexpr std::string_view packetMark = "http://ns.adobe.com/xap/1.0/\0"sv;
constexpr std::string_view extensionMark = "http://ns.adobe.com/xmp/extension/\0"sv;
constexpr XmpName hasExtension = {"http://ns.adobe.com/xmp/note/", "HasExtendedXMP"};
constexpr std::size_t longestPayload = 65533, nameSize = 32, extensionHeader = nameSize + 8;
constexpr std::size_t longestPart = longestPayload - extensionMark.size() - extensionHeader;
constexpr std::size_t longestExtension = std::size_t{64} << 20;

std::string_view textOf(const MetadataSegment& segment) {
  return {reinterpret_cast<const char*>(segment.payload.data()), segment.payload.size()};
}

bool startsWith(const MetadataSegment& segment, std::string_view mark) {
  return segment.marker == app1 && textOf(segment).substr(0, mark.size()) == mark;
}

MetadataSegment segmentOf(std::initializer_list<std::string_view> parts) {
  MetadataSegment segment = {app1, {}};
  for (const std::string_view part : parts)
    segment.payload.insert(segment.payload.end(), part.begin(), part.end());
  return segment;
}

std::uint32_t read32(std::string_view bytes, std::size_t at) {
  std::uint32_t value = 0;
  for (std::size_t i = 0; i < 4; ++i)
    value = value << 8 | static_cast<unsigned char>(bytes[at + i]);
  return value;
}

std::string written32(std::size_t value) {
  std::string bytes;
  for (int shift = 24; shift >= 0; shift -= 8) bytes += static_cast<char>(value >> shift & 255);
  return bytes;
}

// The parts of one extension by their offsets.
struct Extension {
  std::uint32_t size = 0;
  std::map<std::uint32_t, std::string_view> parts;
};

using Extensions = std::map<std::string, Extension>;  // by name

Extensions extensionsIn(const std::vector<MetadataSegment>& segments) {
  Extensions extensions;
  for (const MetadataSegment& segment : segments) {
    if (!isXmpExtension(segment)) continue;
    const std::string_view body = textOf(segment).substr(extensionMark.size());
    if (body.size() < extensionHeader) continue;
    Extension& extension = extensions[std::string(body.substr(0, nameSize))];
    extension.size = read32(body, nameSize);
    extension.parts.emplace(read32(body, nameSize + 4), body.substr(extensionHeader));
  }
  return extensions;
}

// @throws XmpError when it is incomplete or too large.
std::string assembled(const Extension& extension) {
  if (extension.size > longestExtension) throw XmpError("over 64 MiB");
  std::string bytes;
  for (const auto& [offset, part] : extension.parts) {
    if (offset != bytes.size() || part.size() > extension.size - bytes.size())
      throw XmpError("incomplete");
    bytes += part;
  }
  if (bytes.size() != extension.size) throw XmpError("incomplete");
  return bytes;
}

// One packet and what belongs to it.
class PacketOfSegments {
 public:
  explicit PacketOfSegments(const MetadataSegment& segment)
      : packet_(textOf(segment).substr(packetMark.size())),
        extensionName_(packet_.property(hasExtension).text()) {}

  // The name that the packet has for its extension; empty without one.
  const std::string& extensionName() const { return extensionName_; }
  void setExtension(const std::string& bytes) { extension_.emplace(bytes); }
  void forgetExtension() {
    for (XmpProperty& note : packet_.properties(hasExtension)) note.remove();
  }

  void edit(const std::function<void(XmpPacket&)>& edit) {
    edit(packet_);
    if (extension_) edit(*extension_);
  }

  // @throws XmpError when there is no way to make it fit.
  std::vector<MetadataSegment> written() {
    constexpr std::size_t room = longestPayload - packetMark.size();
    if (extension_ && extension_->changed() && extension_->properties().empty()) {
      extension_.reset();
      forgetExtension();
    }
    for (std::size_t size; (size = packet_.bytes(room).size()) > room;)
      moveLargestProperties(size - room);
    std::vector<MetadataSegment> segments(1);
    if (extension_) {
      const std::string bytes = extension_->bytes();
      if (extension_->changed()) nameExtension(md5Hex(bytes));
      for (std::size_t done = 0; done < bytes.size(); done += longestPart) {
        segments.push_back(
            segmentOf({extensionMark, extensionName_, written32(bytes.size()), written32(done),
                       std::string_view(bytes).substr(done, longestPart)}));
      }
    }
    segments[0] = segmentOf({packetMark, packet_.bytes(room)});
    return segments;
  }

  // As one segment of any length.
  std::vector<MetadataSegment> merged() {
    if (extension_) {
      for (const XmpProperty& property : extension_->properties()) packet_.take(property);
    }
    forgetExtension();  // also what the extension itself may say of one
    return {segmentOf({packetMark, packet_.bytes()})};
  }

 private:
  void nameExtension(const std::string& name) {
    extensionName_ = name;
    if (XmpProperty note = packet_.property(hasExtension)) {
      note.setText(name);
    } else {
      packet_.add(hasExtension, "xmpNote", name);
    }
  }

  // So many bytes of them.
  void moveLargestProperties(std::size_t excess) {
    if (!extension_) {
      extension_.emplace();
      nameExtension(std::string(nameSize, '0'));  // takes its place from the start
    }
    const std::vector<XmpProperty> properties = packet_.properties();
    std::vector<std::pair<std::size_t, std::size_t>> largest;  // sizes and places
    for (std::size_t i = 0; i < properties.size(); ++i) {
      const std::size_t size = properties[i].size();
      // The name of the extension takes less, and must stay.
      if (size > 100) largest.emplace_back(size, i);
    }
    std::sort(largest.begin(), largest.end(), [](const auto& a, const auto& b) {
      return a.first != b.first ? a.first > b.first : a.second < b.second;
    });
    std::size_t moved = 0;
    for (const auto& [size, place] : largest) {
      if (moved >= excess || mayMove_ == 0) break;
      moved += size;
      --mayMove_;
      extension_->take(properties[place]);
    }
    if (moved == 0) throw XmpError("too large for its segment");
  }

  XmpPacket packet_;
  std::size_t mayMove_ = 1000;  // each brings its namespaces along
  std::string extensionName_;
  std::optional<XmpPacket> extension_;
};

PacketOfSegments packetWithExtension(const MetadataSegment& segment, Extensions& extensions,
                                     std::vector<Loss>& lost) {
  PacketOfSegments packet(segment);
  if (packet.extensionName().empty()) return packet;
  try {
    const auto found = extensions.find(packet.extensionName());
    if (found == extensions.end()) throw XmpError("missing from the file");
    const Extension extension = std::move(found->second);
    extensions.erase(found);
    packet.setExtension(assembled(extension));
  } catch (const XmpError& error) {
    lost.push_back({"Extended XMP", error.what()});
    packet.forgetExtension();
  }
  return packet;
}

// Each packet's segments are replaced by what `rewritten` makes of it.
void rewriteXmp(std::vector<MetadataSegment>& segments,
                const std::function<std::vector<MetadataSegment>(PacketOfSegments)>& rewritten,
                std::vector<Loss>& lost) {
  Extensions extensions = extensionsIn(segments);
  std::vector<MetadataSegment> result;
  for (const MetadataSegment& segment : segments) {
    if (isXmpExtension(segment)) continue;  // comes with its packet
    if (!isXmpPacket(segment)) {
      result.push_back(segment);
      continue;
    }
    try {
      std::vector<MetadataSegment> written =
          rewritten(packetWithExtension(segment, extensions, lost));
      std::move(written.begin(), written.end(), std::back_inserter(result));
    } catch (const XmpError& error) {
      lost.push_back({"XMP", error.what()});
    }
  }
  for (std::size_t i = 0; i < extensions.size(); ++i)
    lost.push_back({"Extended XMP", "belongs to no packet of the file"});
  segments = std::move(result);
}

}  // namespace

bool isXmpExtension(const MetadataSegment& segment) {
  return startsWith(segment, extensionMark);
}

bool isXmpPacket(const MetadataSegment& segment) {
  return startsWith(segment, packetMark);
}

void editXmp(std::vector<MetadataSegment>& segments, const std::function<void(XmpPacket&)>& edit,
             std::vector<Loss>& lost) {
  rewriteXmp(
      segments,
      [&](PacketOfSegments packet) {
        packet.edit(edit);
        return packet.written();
      },
      lost);
}

void mergeXmpExtensions(std::vector<MetadataSegment>& segments, std::vector<Loss>& lost) {
  if (std::none_of(segments.begin(), segments.end(), isXmpExtension)) return;
  rewriteXmp(
      segments, [](PacketOfSegments packet) { return packet.merged(); }, lost);
}

}  // namespace pelorin::photo
