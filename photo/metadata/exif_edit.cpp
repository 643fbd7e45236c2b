#include "photo/metadata/exif_edit.h"

#include <algorithm>
#include <cmath>
#include <span>
#include <utility>

#include "photo/jpeg/jpeg_codec.h"
#include "photo/metadata/exif_orientation.h"
#include "photo/metadata/tiff.h"
#include "photo/photo_error.h"

namespace pelorin::photo {
namespace {

constexpr std::uint16_t imageWidth = 0x0100, imageLength = 0x0101, stripOffsets = 0x0111,
                        orientation = 0x0112, stripByteCounts = 0x0117, thumbnailOffset = 0x0201,
                        thumbnailLength = 0x0202, exifDirectory = 0x8769, gpsDirectory = 0x8825,
                        subjectArea = 0x9214, pixelXDimension = 0xA002, pixelYDimension = 0xA003,
                        subjectLocation = 0xA214;
constexpr std::size_t markSize = 6, longestPayload = 65533;
constexpr std::uint32_t usualLongerSide = 160, longestSide = 1024;

void setNumbers(EditableTiff& tiff, const TiffDirectory& directory, std::uint16_t tag,
                std::uint32_t value) {
  for (const TiffEntry& entry : directory.entries) {
    if (entry.tag == tag && Tiff::isNumber(entry)) tiff.setNumber(entry, value);
  }
}

// Centre x, y, then nothing, a diameter, or width and height; in pixels of the stored picture.
void turnSubject(EditableTiff& tiff, const TiffEntry* entry, const PictureChange& change) {
  if (entry == nullptr || !Tiff::isNumber(*entry) || entry->count < 2 || entry->count > 4) return;
  const PictureSize before = change.before, after = change.after;
  const PicturePoint centre =
      turned(PicturePoint{static_cast<double>(tiff.number(*entry, 0)) / before.width,
                          static_cast<double>(tiff.number(*entry, 1)) / before.height},
             change.turn);
  const auto write = [&](std::uint32_t index, double value) {
    tiff.setNumber(*entry, static_cast<std::uint32_t>(std::clamp(value, 0.0, 65535.0)), index);
  };
  write(0, std::round(centre.x * after.width));
  write(1, std::round(centre.y * after.height));
  const double scale = static_cast<double>(std::max(after.width, after.height)) /
                       std::max(before.width, before.height);
  if (entry->count == 3) write(2, std::round(tiff.number(*entry, 2) * scale));
  if (entry->count == 4) {
    double width = tiff.number(*entry, 2), height = tiff.number(*entry, 3);
    if (change.turn.swapsAxes()) std::swap(width, height);
    write(2, std::round(width * scale));
    write(3, std::round(height * scale));
  }
}

struct Range {
  std::uint64_t begin = 0, size = 0;
  std::uint64_t end() const { return begin + size; }
};

bool overlaps(const Range& range, const TiffDirectory& directory) {
  return range.begin < directory.end && directory.begin < range.end();
}

// Closes the gap in its directory, which stays where it is and ends earlier.
void removeEntry(EditableTiff& tiff, const TiffDirectory& directory, const TiffEntry& entry) {
  const auto bytes = tiff.bytes().begin();
  const auto begin = bytes + static_cast<std::ptrdiff_t>(entry.place);
  const auto end = bytes + static_cast<std::ptrdiff_t>(directory.end);
  std::fill(std::copy(begin + 12, end, begin), end, std::uint8_t{0});
  tiff.write16(directory.begin, static_cast<std::uint16_t>(tiff.read16(directory.begin) - 1));
}

// The thumbnail of an Exif segment.
class ThumbnailPlace {
 public:
  explicit ThumbnailPlace(std::vector<std::uint8_t>& payload)
      : payload_(payload),
        tiff_(std::span<std::uint8_t>(payload).subspan(markSize)),
        first_(tiff_.firstDirectory()),
        second_(tiff_.nextDirectory(first_)),
        exif_(tiff_.directoryOf(first_.find(exifDirectory))) {
    offset_ = second_.find(thumbnailOffset);
    length_ = second_.find(thumbnailLength);
    if (isOne(offset_) && isOne(length_)) {
      jpeg_ = {tiff_.number(*offset_), tiff_.number(*length_)};
      if (!isFree(jpeg_)) jpeg_ = {};
    }
  }

  bool exists() const { return second_.end > 0; }

  // Writes the new one; false when it cannot be.
  bool replace(ThumbnailMaker& thumbnails) {
    if (jpeg_.size == 0) return false;
    const bool atTheEnd = jpeg_.end() == tiff_.size();
    constexpr std::uint64_t longest = longestPayload - markSize;
    const std::uint64_t room = !atTheEnd               ? jpeg_.size
                               : jpeg_.begin < longest ? longest - jpeg_.begin
                                                       : 0;
    const std::optional<Thumbnail> thumbnail = thumbnails.make(longerSide(), room);
    if (!thumbnail) return false;
    setNumbers(tiff_, second_, imageWidth, thumbnail->size.width);
    setNumbers(tiff_, second_, imageLength, thumbnail->size.height);
    setNumbers(tiff_, second_, orientation, 1);
    // A SHORT may be too narrow, in theory.
    if (!tiff_.setNumber(*length_, static_cast<std::uint32_t>(thumbnail->file.size())))
      return false;
    if (atTheEnd) {
      payload_.resize(markSize + jpeg_.begin);
      payload_.insert(payload_.end(), thumbnail->file.begin(), thumbnail->file.end());
    } else {
      clear(jpeg_);
      std::copy(thumbnail->file.begin(), thumbnail->file.end(), at(jpeg_.begin));
    }
    return true;
  }

  // Unlinks the directory of the thumbnail and everything that follows, and clears the pixels.
  void remove() {
    tiff_.write32(first_.linkPlace, 0);
    for (const Range& strip : strips()) clear(strip);
    if (jpeg_.size == 0) return;
    clear(jpeg_);
    if (jpeg_.end() == tiff_.size()) payload_.resize(markSize + jpeg_.begin);
  }

 private:
  static bool isOne(const TiffEntry* entry) {
    return entry != nullptr && Tiff::isNumber(*entry) && entry->count == 1;
  }

  // Whether nothing that is known stands there.
  bool isFree(const Range& range) const {
    return range.begin >= 8 && tiff_.holds(range.begin, range.size) && !overlaps(range, first_) &&
           !overlaps(range, second_) && !overlaps(range, exif_);
  }

  std::vector<Range> strips() const {
    std::vector<Range> ranges;
    const TiffEntry* offsets = second_.find(stripOffsets);
    const TiffEntry* sizes = second_.find(stripByteCounts);
    if (offsets == nullptr || sizes == nullptr || !Tiff::isNumber(*offsets) ||
        !Tiff::isNumber(*sizes))
      return ranges;
    for (std::uint32_t i = 0; i < std::min(offsets->count, sizes->count); ++i) {
      const Range range = {tiff_.number(*offsets, i), tiff_.number(*sizes, i)};
      if (isFree(range)) ranges.push_back(range);
    }
    return ranges;
  }

  std::uint32_t longerSide() const {
    try {
      const JpegHeader header =
          readJpegHeader(std::span(payload_).subspan(markSize + jpeg_.begin, jpeg_.size));
      return std::clamp(std::max(header.width, header.height), std::uint32_t{16}, longestSide);
    } catch (const PhotoError&) {
      return usualLongerSide;
    }
  }

  std::vector<std::uint8_t>::iterator at(std::uint64_t place) {
    return payload_.begin() + static_cast<std::ptrdiff_t>(markSize + place);
  }
  void clear(const Range& range) { std::fill(at(range.begin), at(range.end()), std::uint8_t{0}); }

  std::vector<std::uint8_t>& payload_;
  EditableTiff tiff_;
  TiffDirectory first_, second_, exif_;
  const TiffEntry *offset_, *length_;
  Range jpeg_;  // empty without one
};

}  // namespace

void editExif(std::vector<std::uint8_t>& payload, const PictureChange& change,
              ThumbnailMaker* thumbnails, std::vector<Loss>& lost) {
  if (!isExif(payload)) return;
  EditableTiff tiff(std::span<std::uint8_t>(payload).subspan(markSize));
  const TiffDirectory first = tiff.firstDirectory();
  const TiffDirectory exif = tiff.directoryOf(first.find(exifDirectory));
  setNumbers(tiff, first, orientation, 1);
  setNumbers(tiff, first, imageWidth, change.after.width);
  setNumbers(tiff, first, imageLength, change.after.height);
  setNumbers(tiff, exif, pixelXDimension, change.after.width);
  setNumbers(tiff, exif, pixelYDimension, change.after.height);
  if (change.turn != Turn{} || change.before != change.after) {
    turnSubject(tiff, exif.find(subjectArea), change);
    turnSubject(tiff, exif.find(subjectLocation), change);
  }
  ThumbnailPlace thumbnail(payload);
  if (!thumbnail.exists()) return;
  if (thumbnails == nullptr) return thumbnail.remove();
  if (thumbnail.replace(*thumbnails)) return;
  thumbnail.remove();
  lost.push_back({"EXIF thumbnail", "the new one has no place there"});
}

void removeExifLocation(std::vector<std::uint8_t>& payload) {
  if (!isExif(payload)) return;
  EditableTiff tiff(std::span<std::uint8_t>(payload).subspan(markSize));
  while (true) {
    const TiffDirectory first = tiff.firstDirectory();
    const TiffEntry* pointer = first.find(gpsDirectory);
    if (pointer == nullptr) return;
    const TiffDirectory gps = tiff.directoryOf(pointer);
    const auto clear = [&](std::uint64_t place, std::uint64_t size) {
      // What a hostile file has elsewhere stays readable.
      if (size == 0 || place < 8 || overlaps({place, size}, first)) return;
      std::fill_n(tiff.bytes().begin() + static_cast<std::ptrdiff_t>(place), size, std::uint8_t{0});
    };
    for (const TiffEntry& entry : gps.entries) clear(entry.valuePlace, entry.valueSize);
    clear(gps.begin, gps.end - gps.begin);
    removeEntry(tiff, first, *pointer);
  }
}

}  // namespace pelorin::photo
