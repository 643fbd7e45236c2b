#pragma once

#include <optional>
#include <string>
#include <vector>

#include "photo/collection/photo_record.h"
#include "photo/collection/scanned_photo.h"
#include "photo/collection/shot.h"

namespace pelorin::photo {

/// The photos of a search: what is compared, and what is reported.
struct PhotoLibrary {
  std::vector<ScannedPhoto> photos;
  std::vector<Shot> shots;  ///< One for each photo.

  /// Adds a photo.
  /// @param path            how it is called; only for reports.
  /// @param stamp           of its file, where there is one.
  /// @param assumeFileTime  whether one without a capture time takes that of its file.
  void add(const std::string& path, const PhotoRecord& record,
           const std::optional<FileStamp>& stamp, bool assumeFileTime);
};

}  // namespace pelorin::photo
