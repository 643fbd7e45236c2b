#pragma once

#include <map>
#include <optional>
#include <string>
#include <vector>

namespace pelorin::image_processing {

// Filters take their options as one text of "key=value;" items. Two readers exist, and they differ
// at the edges on purpose: `FilterParams` for auto-enhance, the splitting functions and
// `readNumber` for the curve filters. Neither trims spaces, neither rejects a malformed text. All
// are stateless or immutable, so any thread may use them; only std::bad_alloc is thrown unless a
// function says more. Numbers have a point and booleans are the words "true" and "false" whatever
// the global locales of C and C++ are.

/// The pieces of `text` that end with `separator` (not empty). What follows the last separator is
/// not returned: "a;b;c" gives "a" and "b".
std::vector<std::string> splitStringAt(const std::string& text, const std::string& separator);

/// `text` before and after the first `separator`, always two strings: "a=b=c" gives "a" and "b=c",
/// "a" and "a=" give "a" and "".
std::vector<std::string> splitStringOnceAt(const std::string& text, const std::string& separator);

/// The number at the start of `text` as `strtod` reads it; 0 when there is none: "0.4abc" is 0.4.
double readNumber(const std::string& text);

/// The number that `text` is as a whole, as `strtod` reads it; nothing when it is none.
std::optional<double> wholeNumber(const std::string& text);

/// "true" or "false".
std::string textOf(bool value);

/// The items of a parameter string by key. An item without "=" is ignored, the last of several
/// with one key counts, and the text after the last ";" is an item as well.
class FilterParams {
 public:
  explicit FilterParams(const std::string& text);

  /// The value of a required key.
  /// @throws std::out_of_range ("map::at") when the key is absent.
  const std::string& at(const std::string& key) const;

  /// Whether the value of `key` starts with "true", as a stream reads it, perhaps after white
  /// space; false when absent or anything else, "1" included.
  bool readBool(const std::string& key) const;

  /// The value of a required key, which must be a decimal number that fits a float, an infinity or
  /// a NaN as a whole, without spaces.
  /// @throws std::out_of_range as `at`, boost::bad_lexical_cast when it is no number.
  float readFloat(const std::string& key) const;

  const std::map<std::string, std::string>& items() const { return items_; }

 private:
  std::map<std::string, std::string> items_;
};

}  // namespace pelorin::image_processing
