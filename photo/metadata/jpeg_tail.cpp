#include "photo/metadata/jpeg_tail.h"

#include <algorithm>
#include <optional>
#include <utility>

#include "photo/jpeg/jpeg_end.h"

namespace pelorin::photo {
namespace {

using namespace std::string_view_literals;
using Bytes = std::span<const std::uint8_t>;
using Kind = TailPart::Kind;

std::string_view textOf(Bytes bytes) {
  return {reinterpret_cast<const char*>(bytes.data()), bytes.size()};
}

std::uint64_t bigEndian(Bytes bytes, std::size_t at, std::size_t size) {
  std::uint64_t value = 0;
  for (std::size_t i = 0; i < size; ++i) value = value << 8 | bytes[at + i];
  return value;
}

std::uint64_t littleEndian32(Bytes bytes, std::size_t at) {
  return bytes[at] | std::uint64_t{bytes[at + 1]} << 8 | std::uint64_t{bytes[at + 2]} << 16 |
         std::uint64_t{bytes[at + 3]} << 24;
}

bool endsWith(Bytes bytes, std::string_view mark) {
  return bytes.size() >= mark.size() && textOf(bytes).substr(bytes.size() - mark.size()) == mark;
}

// How long a part at the end of the bytes is, from what it says there; nothing when it lies.
using Length = std::optional<std::size_t>;

Length within(Bytes bytes, std::uint64_t length) {
  if (length > bytes.size()) return std::nullopt;
  return static_cast<std::size_t>(length);
}

// "SEFH", version, count, entries of 12 bytes that end with place and size; then the table's size
// and "SEFT". A place is a distance back from the table.
Length samsungLength(Bytes bytes) {
  if (!endsWith(bytes, "SEFT") || bytes.size() < 20) return std::nullopt;
  const std::uint64_t tableSize = littleEndian32(bytes, bytes.size() - 8);
  if (tableSize < 12 || tableSize > bytes.size() - 8) return std::nullopt;
  const Bytes table = bytes.subspan(bytes.size() - 8 - tableSize, tableSize);
  if (textOf(table).substr(0, 4) != "SEFH") return std::nullopt;
  const std::uint64_t count = littleEndian32(table, 8);
  if (count > (tableSize - 12) / 12) return std::nullopt;
  std::uint64_t farthest = 0;
  for (std::uint64_t i = 0; i < count; ++i)
    farthest = std::max(farthest, littleEndian32(table, 12 + 12 * i + 4));
  return within(bytes, farthest + tableSize + 8);
}

// Header and footer both begin with the mark; the size of what is between stands in the footer.
Length canonLength(Bytes bytes) {
  constexpr std::string_view mark = "CANON OPTIONAL DATA\0"sv;
  constexpr std::size_t headerSize = 28, footerSize = 64;
  if (bytes.size() < headerSize + footerSize) return std::nullopt;
  const Bytes footer = bytes.subspan(bytes.size() - footerSize);
  if (textOf(footer).substr(0, mark.size()) != mark) return std::nullopt;
  const Length length = within(bytes, bigEndian(footer, mark.size(), 4) + headerSize + footerSize);
  if (!length || textOf(bytes.subspan(bytes.size() - *length)).substr(0, mark.size()) != mark)
    return std::nullopt;
  return length;
}

// Its size, then "cbipcbbl".
Length photoMechanicLength(Bytes bytes) {
  if (!endsWith(bytes, "cbipcbbl") || bytes.size() < 12) return std::nullopt;
  return within(bytes, bigEndian(bytes, bytes.size() - 12, 4) + 12);
}

// Records; each ends with what it is, its size and the mark.
Length fotoStationLength(Bytes bytes) {
  constexpr std::string_view mark = "\xA1\xB2\xC3\xD4"sv;
  std::size_t length = 0;
  while (endsWith(bytes.first(bytes.size() - length), mark) && bytes.size() - length >= 10) {
    const std::uint64_t size = bigEndian(bytes, bytes.size() - length - 8, 4);
    if (size < 10 || size > bytes.size() - length) break;
    length += size;
  }
  return length > 0 ? Length(length) : std::nullopt;
}

// "AXS!" or "AXS*", version, the place of the beginning counted from the file's, and four zeros: the
// beginning is looked for by its mark instead.
Length afcpLength(Bytes bytes) {
  if (bytes.size() < 24) return std::nullopt;
  const std::string_view mark = textOf(bytes).substr(bytes.size() - 12, 4);
  if (mark != "AXS!" && mark != "AXS*") return std::nullopt;
  const std::size_t begin = textOf(bytes.first(bytes.size() - 12)).find(mark);
  if (begin == std::string_view::npos) return std::nullopt;
  return bytes.size() - begin;
}

// Ends with "~", no name, 6 or 10 bytes of data: its length, the byte order and the size of that.
Length mieLength(Bytes bytes) {
  for (const std::size_t sizeBytes : {4, 8}) {
    const std::size_t closing = 4 + sizeBytes + 2;
    if (bytes.size() < closing) continue;
    const Bytes end = bytes.subspan(bytes.size() - closing);
    const bool isMie = end[0] == '~' && end[2] == 0 && end[3] == sizeBytes + 2 &&
                       (end[closing - 2] == 0x10 || end[closing - 2] == 0x18) &&
                       end[closing - 1] == sizeBytes;
    if (!isMie) continue;
    std::uint64_t length = bigEndian(end, 4, sizeBytes);
    if (end[closing - 2] == 0x18) {
      length = 0;
      for (std::size_t i = sizeBytes; i-- > 0;) length = length << 8 | end[4 + i];
    }
    if (length >= closing) return within(bytes, length);
  }
  return std::nullopt;
}

// How many bytes of MP4 boxes these begin with.
std::size_t videoLength(Bytes bytes) {
  std::uint64_t at = 0;
  if (bytes.size() < 8 || textOf(bytes).substr(4, 4) != "ftyp") return 0;
  while (bytes.size() - at >= 8) {
    std::uint64_t size = bigEndian(bytes, at, 4);
    if (size == 1 && bytes.size() - at >= 16) size = bigEndian(bytes, at + 8, 8);
    if (size == 0) return bytes.size();  // to the end
    if (size < 8 || size > bytes.size() - at) break;
    at += size;
  }
  return at;
}

// Padding between two parts; a video's first box begins with zeros of its own.
std::size_t zerosBefore(Bytes tail) {
  const auto content = std::find_if(tail.begin(), tail.end(), [](int byte) { return byte != 0; });
  const auto zeros = static_cast<std::size_t>(content - tail.begin());
  const std::size_t type = textOf(tail).substr(0, zeros + 8).find("ftyp");
  return type != std::string_view::npos && type >= 4 ? type - 4 : zeros;
}

struct Ending {
  Kind kind;
  Length (*length)(Bytes);
};

constexpr Ending endings[] = {{Kind::samsung, samsungLength},
                              {Kind::canonVrd, canonLength},
                              {Kind::photoMechanic, photoMechanicLength},
                              {Kind::fotoStation, fotoStationLength},
                              {Kind::afcp, afcpLength},
                              {Kind::mie, mieLength}};

TailPart partOf(Kind kind, Bytes bytes) {
  return {kind, {bytes.begin(), bytes.end()}};
}

// Takes the parts off that are known by their ends.
std::vector<TailPart> takeEndings(Bytes& tail) {
  std::vector<TailPart> parts;
  for (bool found = true; found;) {
    found = false;
    for (const Ending& ending : endings) {
      const Length length = ending.length(tail);
      if (!length || *length == 0) continue;
      parts.insert(parts.begin(), partOf(ending.kind, tail.last(*length)));
      tail = tail.first(tail.size() - *length);
      found = true;
    }
  }
  return parts;
}

}  // namespace

std::string_view nameOf(Kind kind) {
  switch (kind) {
    case Kind::gainMap:
      return "gain map";
    case Kind::picture:
      return "second picture";
    case Kind::video:
      return "motion photo video";
    case Kind::samsung:
      return "Samsung trailer";
    case Kind::canonVrd:
      return "Canon VRD trailer";
    case Kind::photoMechanic:
      return "Photo Mechanic trailer";
    case Kind::fotoStation:
      return "FotoStation trailer";
    case Kind::afcp:
      return "AFCP trailer";
    case Kind::mie:
      return "MIE trailer";
    case Kind::unknown:
      break;
  }
  return "data behind the picture";
}

bool isGainMap(Bytes file) {
  // All of these stand in the first segments.
  const std::string_view head = textOf(file).substr(0, std::size_t{1} << 17);
  for (const std::string_view mark :
       {"http://ns.adobe.com/hdr-gain-map/1.0/"sv, "urn:iso:std:iso:ts:21496:-1\0"sv,
        "urn:com:apple:photo:2020:aux:hdrgainmap"sv}) {
    if (head.find(mark) != std::string_view::npos) return true;
  }
  return false;
}

bool samsungHoldsPictures(Bytes trailer) {
  constexpr std::size_t entrySize = 12, blockHead = 8;  // mark and kind, the length of the name
  if (samsungLength(trailer) != trailer.size()) return false;
  const std::uint64_t tableSize = littleEndian32(trailer, trailer.size() - 8);
  const auto tablePlace = static_cast<std::size_t>(trailer.size() - 8 - tableSize);
  const Bytes table = trailer.subspan(tablePlace);
  const std::uint64_t count = littleEndian32(table, 8);
  for (std::size_t i = 0; i < count; ++i) {
    const std::uint64_t back = littleEndian32(table, entrySize * (i + 1) + 4);
    if (back < blockHead || back > tablePlace) continue;
    const Bytes block = trailer.subspan(tablePlace - static_cast<std::size_t>(back),
                                        static_cast<std::size_t>(back));
    const std::uint64_t nameSize = littleEndian32(block, 4);
    if (nameSize > block.size() - blockHead) continue;
    const Bytes data = block.subspan(blockHead + static_cast<std::size_t>(nameSize));
    if (textOf(data).starts_with("\xFF\xD8\xFF")) return true;
  }
  return false;
}

std::vector<TailPart> readTail(Bytes tail) {
  std::vector<TailPart> last = takeEndings(tail);
  std::vector<TailPart> parts;
  while (tail = tail.subspan(zerosBefore(tail)), !tail.empty()) {
    std::size_t length = tail.size();
    if (const std::size_t picture = jpegEnd(tail)) {
      length = picture;
      const Bytes file = tail.first(length);
      parts.push_back(partOf(isGainMap(file) ? Kind::gainMap : Kind::picture, file));
    } else if (const std::size_t video = videoLength(tail)) {
      length = video;
      parts.push_back(partOf(Kind::video, tail.first(length)));
    } else {
      parts.push_back(partOf(Kind::unknown, tail));
    }
    tail = tail.subspan(length);
  }
  std::move(last.begin(), last.end(), std::back_inserter(parts));
  return parts;
}

}  // namespace pelorin::photo
