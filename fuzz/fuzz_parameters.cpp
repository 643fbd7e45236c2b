// A parameter string for every filter: the pieces that readers cut make the text again, and a filter
// throws exactly where its check says that something is missing or unreadable.
#include <boost/lexical_cast/bad_lexical_cast.hpp>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <stdexcept>
#include <string>

#include "image_processing/core/parameter_strings.h"
#include "image_processing/filters/default_filter_factory.h"
#include "image_processing/filters/filtered_image.h"
#include "image_processing/filters/parameter_check.h"

using namespace pelorin::image_processing;

namespace {

void require(bool holds) {
  if (!holds) std::abort();
}

void cut(const std::string& text) {
  for (const std::string separator : {";", "=", "=1"}) {
    std::string joined;
    for (const std::string& piece : splitStringAt(text, separator)) joined += piece + separator;
    require(text.starts_with(joined));
    require(text.find(separator, joined.size()) == std::string::npos);
    const auto halves = splitStringOnceAt(text, separator);
    require(halves.size() == 2 && text.starts_with(halves[0]));
  }
  const auto whole = wholeNumber(text);
  if (whole && *whole == *whole) require(readNumber(text) == *whole);
}

bool throws(const FilterDescription& filter, const std::string& params) {
  auto photo = std::make_shared<Image<RGBA8Pixel>>(2, 2);
  photo->set({10, 20, 30, 255});
  FilteredImage session(photo, {}, "", defaultFilterConfigValue,
                        DefaultFilterFactory::filterFactory());
  Image<RGBA8Pixel> output(2, 2);
  try {
    session.applyFilterWithParams(filter.name, params, defaultFilterConfigValue, output);
    return false;
  } catch (const std::out_of_range&) {
    return true;
  } catch (const boost::bad_lexical_cast&) {
    return true;
  }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  static constexpr const char* words[] = {
      "slider=", "gtmOnly=", "true;", "maskRadius=", "r=",     "0.4;",  "nan;",
      "s1=",     "1e999;",   ";",     "-inf;",       "0x1p3;", "filter"};
  // Small bytes stand for words, so that random ones make items.
  std::string params;
  for (std::size_t i = 0; i < size; ++i) {
    if (data[i] < std::size(words)) {
      params += words[data[i]];
    } else {
      params += static_cast<char>(data[i]);
    }
  }
  cut(params);
  for (const auto& [name, filter] : DefaultFilterFactory::filterFactory()->descriptions) {
    bool faulty = false;
    for (const ParameterFault& fault : checkParameters(*filter, params)) {
      require(!fault.message.empty());
      faulty = faulty || fault.kind == ParameterFault::Kind::missing ||
               fault.kind == ParameterFault::Kind::unreadable;
    }
    require(throws(*filter, params) == faulty);
  }
  return 0;
}
