#include "image_processing/core/parameter_strings.h"

#include <locale.h>
#include <stdlib.h>

#include <boost/algorithm/string/classification.hpp>
#include <boost/algorithm/string/split.hpp>
#include <boost/lexical_cast/bad_lexical_cast.hpp>
#include <cmath>
#include <new>
#include <stdexcept>
#include <string_view>

namespace pelorin::image_processing {
namespace {

/// The C library's locale with a point. A Java launcher sets that of its user, under which plain
/// `strtod` may expect a comma.
locale_t classicLocale() {
  static const locale_t classic = [] {
    const locale_t made = newlocale(LC_ALL_MASK, "C", nullptr);
    if (made == nullptr) throw std::bad_alloc();
    return made;
  }();
  return classic;
}

}  // namespace

std::vector<std::string> splitStringAt(const std::string& text, const std::string& separator) {
  std::vector<std::string> pieces;
  std::size_t start = 0;
  for (std::size_t found; (found = text.find(separator, start)) != std::string::npos;) {
    pieces.push_back(text.substr(start, found - start));
    start = found + separator.size();
  }
  return pieces;
}

std::vector<std::string> splitStringOnceAt(const std::string& text, const std::string& separator) {
  const std::size_t found = text.find(separator);
  if (found == std::string::npos) return {text, ""};
  return {text.substr(0, found), text.substr(found + separator.size())};
}

double readNumber(const std::string& text) {
  return strtod_l(text.c_str(), nullptr, classicLocale());
}

std::optional<double> wholeNumber(const std::string& text) {
  char* end = nullptr;
  const double number = strtod_l(text.c_str(), &end, classicLocale());
  if (text.empty() || end != text.c_str() + text.size()) return std::nullopt;
  return number;
}

std::string textOf(bool value) {
  return value ? "true" : "false";
}

FilterParams::FilterParams(const std::string& text) {
  std::vector<std::string> tokens;
  boost::algorithm::split(tokens, text, boost::algorithm::is_any_of(";"));
  for (const std::string& token : tokens) {
    const std::size_t equals = token.find('=');
    if (equals != std::string::npos) items_[token.substr(0, equals)] = token.substr(equals + 1);
  }
}

const std::string& FilterParams::at(const std::string& key) const {
  const auto found = items_.find(key);
  // Not std::map::at: its message differs between standard libraries.
  if (found == items_.end()) throw std::out_of_range("map::at");
  return found->second;
}

bool FilterParams::readBool(const std::string& key) const {
  const auto found = items_.find(key);
  if (found == items_.end()) return false;
  // What a stream that knows the names of booleans reads: white space, the name, and then whatever it likes.
  const std::string_view text = found->second;
  const std::size_t start = text.find_first_not_of(" \t\n\v\f\r");
  return start != text.npos && text.substr(start).starts_with("true");
}

float FilterParams::readFloat(const std::string& key) const {
  // As `boost::lexical_cast` reads it, which would ask the program's locale for the point.
  const std::string& text = at(key);
  char* end = nullptr;
  const float value = strtof_l(text.c_str(), &end, classicLocale());
  const bool isWhole = end != text.c_str() && end == text.c_str() + text.size();
  const bool hasDigits = text.find_first_of("0123456789") != std::string::npos;
  // Leading white space, hexadecimal digits and numbers too large for a float are no numbers here.
  const bool isNumber = isWhole && text.find_first_of(" \t\n\v\f\rxX") == std::string::npos &&
                        !(std::isinf(value) && hasDigits);
  if (!isNumber) throw boost::bad_lexical_cast();
  return value;
}

}  // namespace pelorin::image_processing
