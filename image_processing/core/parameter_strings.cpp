#include "image_processing/core/parameter_strings.h"

#include <locale.h>
#include <stdlib.h>

#include <boost/algorithm/string/classification.hpp>
#include <boost/algorithm/string/split.hpp>
#include <boost/lexical_cast.hpp>
#include <locale>
#include <sstream>
#include <stdexcept>

namespace pelorin::image_processing {

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
  // A Java launcher sets the locale of its user, under which plain strtod may expect a comma.
  static const locale_t classic = newlocale(LC_ALL_MASK, "C", nullptr);
  return classic != nullptr ? strtod_l(text.c_str(), nullptr, classic)
                            : strtod(text.c_str(), nullptr);
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
  std::istringstream stream(found->second);
  stream.imbue(std::locale::classic());
  bool value = false;
  stream >> std::boolalpha >> value;
  return !stream.fail() && value;
}

float FilterParams::readFloat(const std::string& key) const {
  return boost::lexical_cast<float>(at(key));
}

}  // namespace pelorin::image_processing
