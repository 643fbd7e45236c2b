#pragma once

#include <optional>
#include <string>
#include <vector>

#include "cli/frame/talk.h"
#include "cli/frame/verb.h"
#include "image_processing/filters/filter_description.h"

namespace pelorin::cli {

using FilterDescriptions = std::vector<const image_processing::FilterDescription*>;

/// The option that stands for a key: "--mask-radius" for "maskRadius".
std::string optionFor(const std::string& key);

/// The options of a verb that stand for keys of parameter strings. Filters tell of their keys
/// themselves, so a new key is an option without a line here.
class FilterOptions {
 public:
  FilterOptions() = default;

  /// Adds an option for every key that one of the filters has, and `--params`.
  /// @param example  for the help of `--params`.
  FilterOptions(Verb verb, const FilterDescriptions& filters, const std::string& example);

  /// Whether the user gave `--params`.
  bool verbatim() const { return params_.given(); }

  /// The parameter string that the user means for this filter: `--params` as it is, or what the
  /// other options say, with a value for every key that the filter cannot do without. Notes what
  /// the filter will ignore and, of `--params`, what it takes otherwise than it looks.
  /// @throws UsageError for options without effect on the filter, keys that it does not have,
  ///         values that are none.
  std::string read(const image_processing::FilterDescription& filter, Talk& talk) const;

 private:
  struct Key {
    std::string key;
    Option on;   ///< Gives the value, or makes a boolean true.
    Option off;  ///< Makes a boolean false; mostly there is none.

    /// The name of the one that the user gave; none when neither.
    std::optional<std::string> given() const;
  };

  const Key* find(const std::string& key) const;
  std::string readVerbatim(const image_processing::FilterDescription& filter, Talk& talk) const;

  std::vector<Key> keys_;
  Option params_;
};

/// "key=text;" for a text that the user gave to `option`.
/// @throws UsageError when the filter would not take it for what it is.
std::string parameterItem(const image_processing::FilterDescription& filter, const std::string& key,
                          const std::string& option, const std::string& text);

}  // namespace pelorin::cli
