#pragma once

#include <cstdint>
#include <initializer_list>
#include <optional>
#include <string>
#include <vector>

// The option parser by the names of its classes alone: its headers cost seconds in every file that
// includes them.
namespace CLI {
class App;
class Option;
}  // namespace CLI

namespace pelorin::cli {

/// One option of a verb. A handle: copies speak of the same option, which lives as long as the
/// command line. Setters return the handle, so that they can be strung together.
class Option {
 public:
  /// Speaks of no option yet.
  Option() = default;
  explicit Option(CLI::Option* option) : option_(option) {}

  Option required();
  /// What the help calls its value.
  Option type(const std::string& name);
  /// The heading it stands under in the help.
  Option group(const std::string& heading);
  /// Replaces the help that it was added with.
  Option help(const std::string& text);
  /// Takes whole numbers from `lowest` to `highest` only; that is also its type.
  Option between(int lowest, int highest);
  /// Takes whole numbers above 0, which may end in k, M or G: thousands, millions, thousand millions.
  Option inThousands();
  /// Takes these values only; they are also its type.
  Option oneOf(std::initializer_list<const char*> values);
  /// A list takes one value each time the option is given, not all words that follow.
  Option oneValueEach();
  /// A list takes one word, cut at every `separator`.
  Option separatedBy(char separator);
  Option needs(Option other);
  Option excludes(Option other);

  /// Whether this speaks of an option at all.
  bool exists() const { return option_ != nullptr; }
  /// Its longest name: "--output".
  std::string name() const;
  /// Whether the user gave it; false where there is none.
  bool given() const;
  /// What the user gave, the last where it was given often.
  std::string text() const;

 private:
  CLI::Option* option_ = nullptr;
};

/// One verb of the command line, for adding its options. A handle, like `Option`; variables that
/// options fill must live as long as the command line.
class Verb {
 public:
  Verb() = default;
  explicit Verb(CLI::App* app) : app_(app) {}

  /// Adds an option with a value.
  /// @param names  "--name", "-n,--name", or "NAME" for a positional one.
  Option option(const std::string& names, std::string& value, const std::string& help);
  Option option(const std::string& names, std::optional<std::string>& value,
                const std::string& help);
  Option option(const std::string& names, std::vector<std::string>& values,
                const std::string& help);
  Option option(const std::string& names, int& value, const std::string& help);
  Option option(const std::string& names, std::uint32_t& value, const std::string& help);
  Option option(const std::string& names, std::uint64_t& value, const std::string& help);
  /// Adds one whose value is asked for later, with `Option::text`.
  Option option(const std::string& names, const std::string& help);
  /// Adds an option without a value.
  Option flag(const std::string& names, bool& given, const std::string& help);
  Option flag(const std::string& names, const std::string& help);

  /// The option of this name, which must have been added.
  Option named(const std::string& name) const;
  /// Adds to what stands behind the options in the help.
  void addToFooter(const std::string& text);

 private:
  CLI::App* app_ = nullptr;
};

}  // namespace pelorin::cli
