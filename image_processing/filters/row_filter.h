#pragma once

#include <cstdint>
#include <functional>
#include <string>

#include "image_processing/core/image_metadata.h"
#include "image_processing/core/rows.h"
#include "image_processing/core/workers.h"
#include "image_processing/filters/filter_config.h"

namespace pelorin::image_processing {

/// All that one filtering is told, but for the pixels.
struct RowRequest {
  std::uint32_t width, height;
  ImageMetadata metadata = {};
  FilterConfig config = defaultFilterConfigValue;  ///< The session's and the application's.
  std::string params = {};
};

/// How a filter goes over the rows of a picture; none of it changes a byte.
struct RowWork {
  std::uint32_t bandHeight = 16;    ///< Rows asked for at a time, at least 1.
  std::function<bool()> stop = {};  ///< Asked between bands whether to give up; may be empty.
  /// Share the work; null for none. Source and sink are used by one thread at a time, `stop` by any.
  Workers* workers = nullptr;
};

/// A filter at work on one picture that comes as rows, and needs no more memory than some of them
/// take. It makes the very bytes that the filter makes of whole pictures.
class RowFilter {
 public:
  virtual ~RowFilter() = default;

  /// Whether it must have seen all rows before it can filter the first.
  virtual bool looksFirst() const { return false; }

  /// Sees all rows, once and first, where `looksFirst`.
  /// @returns false when it gave up since `work.stop` said so.
  /// @throws std::bad_alloc, and what the source throws.
  virtual bool look(RowSource&, const RowWork&) { return true; }

  /// Filters all rows, the same ones again, once.
  /// @returns false when it gave up; some rows were written then.
  /// @throws std::bad_alloc, and what source and sink throw.
  virtual bool filter(RowSource& rows, RowSink& filtered, const RowWork& work) = 0;
};

/// Whether a sweep over rows is to end here.
inline bool shallStop(const RowWork& work) {
  return work.stop && work.stop();
}

}  // namespace pelorin::image_processing
