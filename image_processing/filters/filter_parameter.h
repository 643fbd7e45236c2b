#pragma once

#include <cstddef>
#include <limits>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace pelorin::image_processing {

enum class ParameterKind {
  number,
  boolean,
  numbers,  ///< A list; every number, the last as well, is followed by a comma.
};

/// One key of a filter's parameter string, for those who offer it to a user, check it or write about
/// it. What the filter does with the key is its own affair: nothing is clamped to the range.
struct FilterParameter {
  std::string name;  ///< The key: "slider".
  ParameterKind kind;
  std::string description;  ///< One sentence for users, without the full stop.

  float lowest = -std::numeric_limits<float>::infinity();  ///< Of a number, or of each in a list.
  float highest = std::numeric_limits<float>::infinity();  ///< Inclusive, as `lowest` is.
  bool aboveLowest = false;                                ///< `lowest` itself is outside.
  std::size_t fewest = 1;                                  ///< A shorter list is ignored.

  /// What counts without the key, 0 or 1 for a boolean; of a required one, where a user may begin.
  /// None when the filter has something of its own that no parameter string can say.
  std::optional<float> standard = {};
  bool required = false;      ///< Without it the filter throws std::out_of_range ("map::at").
  std::string onlyWith = {};  ///< The boolean without which this key does nothing; mostly none.
};

/// How a filter cuts its parameter string into items and reads the values.
enum class ParameterReader {
  /// With `FilterParams`: booleans are "true" and "false", a number that is none throws
  /// boost::bad_lexical_cast, the text after the last ";" is an item as well.
  filterParams,
  /// With `splitStringAt` and `readNumber`: booleans are 0 and 1, every text reads as some number,
  /// the text after the last ";" is ignored.
  splitStrings,
};

/// What a filter takes beside the photo.
struct FilterParameters {
  std::vector<FilterParameter> rows;  ///< None: the filter ignores its parameter string.
  ParameterReader reader = ParameterReader::filterParams;
  bool readsFaces = false;  ///< Face boxes change the result.

  /// The row of this key, or null.
  const FilterParameter* find(std::string_view key) const {
    for (const FilterParameter& row : rows) {
      if (row.name == key) return &row;
    }
    return nullptr;
  }
};

}  // namespace pelorin::image_processing
