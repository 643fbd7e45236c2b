#include "image_processing/filters/parameter_check.h"

#include <boost/lexical_cast/bad_lexical_cast.hpp>
#include <cmath>
#include <utility>

#include "image_processing/core/number_text.h"
#include "image_processing/core/parameter_strings.h"

namespace pelorin::image_processing {
namespace {

using Kind = ParameterFault::Kind;

std::string textOfNumber(double value) {
  return roundedText(value, 6);
}

std::string quoted(const std::string& text) {
  return "'" + text + "'";
}

std::string rangeText(const FilterParameter& row) {
  if (std::isfinite(row.lowest) && std::isfinite(row.highest)) {
    return " from " + textOfNumber(row.lowest) + " to " + textOfNumber(row.highest);
  }
  if (std::isfinite(row.lowest)) {
    return (row.aboveLowest ? " above " : " of at least ") + textOfNumber(row.lowest);
  }
  return std::isfinite(row.highest) ? " of at most " + textOfNumber(row.highest) : "";
}

bool isInRange(const FilterParameter& row, double value) {
  return value <= row.highest && (row.aboveLowest ? value > row.lowest : value >= row.lowest);
}

/// Looks through the items of one parameter string.
class Check {
 public:
  Check(const FilterDescription& filter, FilterParameters parameters)
      : filter_(filter), parameters_(std::move(parameters)) {}

  void item(const std::string& text) {
    if (text.empty()) return;
    const bool splits = parameters_.reader == ParameterReader::splitStrings;
    const std::vector<std::string> keyAndValue = splitStringOnceAt(text, "=");
    const FilterParameter* row = parameters_.find(keyAndValue[0]);
    if (row == nullptr) {
      unknown(keyAndValue[0]);
    } else if (!splits && text.find('=') == std::string::npos) {
      add(Kind::ignored, *row, "the key alone is ignored");
    } else {
      value(*row, keyAndValue[1]);
    }
  }

  /// @param text  what follows the last ";".
  void ending(const std::string& text) {
    if (text.empty()) return;
    if (parameters_.reader == ParameterReader::filterParams) {
      item(text);
    } else {
      faults_.push_back({Kind::ignored, "",
                         "what follows the last ';' is ignored: end every parameter with one"});
    }
  }

  std::vector<ParameterFault> finish(const std::string& params) {
    const FilterParams given(params);
    for (const FilterParameter& row : parameters_.rows) {
      if (!row.required || given.items().contains(row.name)) continue;
      const std::string example =
          row.standard ? row.name + "=" + valueText(row, parameters_.reader, *row.standard) + ";"
                       : row.name + "=...;";
      faults_.push_back({Kind::missing, row.name,
                         filter_.name + " needs " + row.name + ", " +
                             wantedValue(row, parameters_.reader) + ", for example \"" + example +
                             "\""});
    }
    return std::move(faults_);
  }

 private:
  void unknown(const std::string& key) {
    std::string message = filter_.name + " takes no parameters";
    if (!parameters_.rows.empty()) {
      message = filter_.name + " has no parameter " + quoted(key) + "; it takes ";
      for (const FilterParameter& row : parameters_.rows) {
        if (&row != &parameters_.rows.front()) {
          message += &row == &parameters_.rows.back() ? " and " : ", ";
        }
        message += row.name;
      }
    }
    faults_.push_back({Kind::unknown, key, message});
  }

  void add(Kind kind, const FilterParameter& row, const std::string& finding) {
    faults_.push_back({kind, row.name,
                       row.name + " of " + filter_.name + " wants " +
                           wantedValue(row, parameters_.reader) + "; " + finding});
  }

  void value(const FilterParameter& row, const std::string& text) {
    switch (row.kind) {
      case ParameterKind::number:
        number(row, text);
        break;
      case ParameterKind::boolean:
        boolean(row, text);
        break;
      case ParameterKind::numbers:
        numbers(row, text);
        break;
    }
  }

  /// @returns whether the text is in order.
  bool number(const FilterParameter& row, const std::string& text) {
    const std::size_t before = faults_.size();
    if (const std::optional<double> number = wholeNumber(text)) {
      if (!std::isfinite(*number)) {
        add(Kind::misread, row, quoted(text) + " is not finite");
      } else if (!isInRange(row, *number)) {
        add(Kind::misread, row, text + " is outside");
      }
    } else if (parameters_.reader == ParameterReader::filterParams) {
      add(Kind::unreadable, row, quoted(text) + " is no number");
    } else {
      add(Kind::misread, row, quoted(text) + " counts as " + textOfNumber(readNumber(text)));
    }
    return faults_.size() == before;
  }

  void boolean(const FilterParameter& row, const std::string& text) {
    if (parameters_.reader == ParameterReader::filterParams) {
      const bool value = FilterParams("value=" + text).readBool("value");
      if (text != textOf(value)) {
        add(Kind::misread, row, quoted(text) + " counts as " + textOf(value));
      }
    } else if (!wholeNumber(text)) {
      const bool value = readNumber(text) != 0.0;
      add(Kind::misread, row, quoted(text) + " counts as " + (value ? "1" : "0"));
    }
  }

  void numbers(const FilterParameter& row, const std::string& text) {
    const std::vector<std::string> list = splitStringAt(text, ",");
    for (const std::string& one : list) {
      if (!number(row, one)) break;  // one complaint a list will do
    }
    const std::string rest = text.substr(text.rfind(',') + 1);
    if (!rest.empty()) add(Kind::ignored, row, quoted(rest) + " has no comma and is ignored");
    if (list.size() < row.fewest) add(Kind::ignored, row, "a shorter list is ignored");
  }

  /// The number that is the whole text, in the eyes of both readers.
  static std::optional<double> wholeNumber(const std::string& text) {
    try {
      return FilterParams("value=" + text).readFloat("value");
    } catch (const boost::bad_lexical_cast&) {
      return std::nullopt;
    }
  }

  const FilterDescription& filter_;
  const FilterParameters parameters_;
  std::vector<ParameterFault> faults_;
};

}  // namespace

std::vector<ParameterFault> checkParameters(const FilterDescription& filter,
                                            const std::string& params) {
  Check check(filter, filter.parameters());
  for (const std::string& item : splitStringAt(params, ";")) check.item(item);
  check.ending(params.substr(params.rfind(';') + 1));
  return check.finish(params);
}

std::string wantedValue(const FilterParameter& row, ParameterReader reader) {
  switch (row.kind) {
    case ParameterKind::number:
      break;
    case ParameterKind::boolean:
      return reader == ParameterReader::filterParams ? "true or false" : "0 or 1";
    case ParameterKind::numbers:
      return textOfNumber(static_cast<double>(row.fewest)) + " or more numbers" + rangeText(row) +
             ", a comma after each";
  }
  return "a number" + rangeText(row);
}

std::string valueText(const FilterParameter& row, ParameterReader reader, float value) {
  const bool inWords =
      row.kind == ParameterKind::boolean && reader == ParameterReader::filterParams;
  return inWords ? textOf(value != 0.0f) : textOfNumber(value);
}

std::string requiredParameters(const FilterParameters& parameters) {
  std::string params;
  for (const FilterParameter& row : parameters.rows) {
    if (!row.required || !row.standard) continue;
    params += row.name + "=" + valueText(row, parameters.reader, *row.standard) + ";";
  }
  return params;
}

}  // namespace pelorin::image_processing
