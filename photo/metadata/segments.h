#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

#include "photo/jpeg/metadata_segment.h"

namespace pelorin::photo {

/// Exif and XMP segments begin with these.
constexpr std::string_view exifMark("Exif\0\0", 6);
constexpr std::string_view xmpMark("http://ns.adobe.com/xap/1.0/\0", 29);

/// A segment of a marker, a beginning and content.
MetadataSegment segmentOf(std::uint8_t marker, std::string_view mark,
                          std::span<const std::uint8_t> content);

/// The content of the first segment that begins so; empty without one.
std::span<const std::uint8_t> contentOf(std::span<const MetadataSegment> segments,
                                        std::uint8_t marker, std::string_view mark);

/// Whether a segment is a part of a colour profile.
bool isColourProfile(const MetadataSegment& segment);

/// Whether a segment tells of a gain map in the words of ISO 21496-1.
bool isIsoGainMap(const MetadataSegment& segment);

/// Appends a colour profile, cut into segments; one above 16 MB is left out.
void addColourProfile(std::span<const std::uint8_t> profile,
                      std::vector<MetadataSegment>& segments);

/// The colour profile in segments, put together; empty when there is none or a part is missing.
std::vector<std::uint8_t> colourProfileOf(std::span<const MetadataSegment> segments);

/// Whether the colour profile in segments is one for grey.
bool isGreyProfile(std::span<const MetadataSegment> segments);

}  // namespace pelorin::photo
