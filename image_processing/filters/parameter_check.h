#pragma once

#include <string>
#include <vector>

#include "image_processing/filters/filter_description.h"

namespace pelorin::image_processing {

/// Something in a parameter string that does not mean what it seems to.
struct ParameterFault {
  enum class Kind {
    unknown,     ///< The filter has no such key and ignores it.
    missing,     ///< A key is required: the filter throws std::out_of_range.
    unreadable,  ///< A value is no number: the filter throws boost::bad_lexical_cast.
    misread,     ///< The filter takes the value for another one, or it is outside the range.
    ignored,     ///< The filter does not see this text.
  };
  Kind kind;
  std::string key;      ///< Empty where the text belongs to no key.
  std::string message;  ///< One clause that names the key, the filter and what it wants.
};

/// What is wrong with a parameter string for this filter, in the order of the text, what is missing
/// last. The filter itself throws only for `missing` and `unreadable`; everything else it takes in
/// silence. Any thread may call; only std::bad_alloc is thrown.
std::vector<ParameterFault> checkParameters(const FilterDescription& filter,
                                            const std::string& params);

/// What a value of this key is: "a number from 0 to 1", "true or false".
std::string wantedValue(const FilterParameter& row, ParameterReader reader);

/// A value as a parameter string has it: 0 ... 1 of a boolean in the reader's words, numbers as
/// short as they can be told apart by their first six digits.
std::string valueText(const FilterParameter& row, ParameterReader reader, float value);

/// The items of a parameter string that the filter cannot do without, with the values where a user
/// may begin: "slider=0.4;" for the automatic enhancements, "" for most.
std::string requiredParameters(const FilterParameters& parameters);

}  // namespace pelorin::image_processing
