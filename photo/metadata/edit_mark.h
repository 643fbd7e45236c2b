#pragma once

#include <span>
#include <string>
#include <vector>

#include "photo/jpeg/metadata_segment.h"
#include "photo/metadata/loss.h"

namespace pelorin::photo {

/// What Quenby did to a photo, as its XMP tells it: an event of xmpMM:History with the action
/// "edited". Texts are UTF-8.
struct EditMark {
  std::string version;  ///< Of Quenby, as in the software agent "Quenby 1.2".
  std::string filter;  ///< Its name in the registry, "AE0"; it and what follows are the parameters.
  std::string params;  ///< "slider=0.4;gtmOnly=true"
  std::string when = {};  ///< ISO 8601; empty where it is not stated.

  friend bool operator==(const EditMark&, const EditMark&) = default;
};

/// Appends a mark to the history that the segments of a JPEG file tell; a packet is made where there
/// is none. Packets that cannot be read go, as `editXmp` has it.
void addEditMark(std::vector<MetadataSegment>& segments, const EditMark& mark,
                 std::vector<Loss>& lost);

/// The marks of Quenby's in the history that the segments tell, in its order. Any bytes are safe.
std::vector<EditMark> editMarksOf(std::span<const MetadataSegment> segments);

/// For a user: "AE0, slider 0.4".
std::string textOf(const EditMark& mark);

}  // namespace pelorin::photo
