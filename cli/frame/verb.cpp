#include "cli/frame/verb.h"

#include <CLI/CLI.hpp>

namespace pelorin::cli {

Option Option::required() {
  option_->required();
  return *this;
}

Option Option::type(const std::string& name) {
  option_->type_name(name);
  return *this;
}

Option Option::group(const std::string& heading) {
  option_->group(heading);
  return *this;
}

Option Option::help(const std::string& text) {
  option_->description(text);
  return *this;
}

Option Option::between(int lowest, int highest) {
  option_->check(CLI::Range(lowest, highest).description(""));
  return type(std::to_string(lowest) + "-" + std::to_string(highest));
}

Option Option::inThousands() {
  const std::map<std::string, std::uint64_t> units = {
      {"k", 1'000}, {"M", 1'000'000}, {"G", 1'000'000'000}};
  option_->transform(CLI::AsNumberWithUnit(units, CLI::AsNumberWithUnit::CASE_SENSITIVE));
  option_->check(CLI::PositiveNumber);
  return type("N");
}

Option Option::oneOf(std::initializer_list<const char*> values) {
  option_->check(
      CLI::IsMember(std::vector<std::string>(values.begin(), values.end())).description(""));
  std::string all;
  for (const char* value : values) all += (all.empty() ? "" : "|") + std::string(value);
  return type(all);
}

Option Option::oneValueEach() {
  option_->allow_extra_args(false);
  return *this;
}

Option Option::separatedBy(char separator) {
  option_->delimiter(separator);
  return oneValueEach();
}

Option Option::needs(Option other) {
  option_->needs(other.option_);
  return *this;
}

Option Option::excludes(Option other) {
  option_->excludes(other.option_);
  return *this;
}

std::string Option::name() const {
  return option_->get_name();
}

bool Option::given() const {
  return option_ != nullptr && option_->count() > 0;
}

std::string Option::text() const {
  return option_->as<std::string>();
}

Option Verb::option(const std::string& names, std::string& value, const std::string& help) {
  return Option(app_->add_option(names, value, help));
}

Option Verb::option(const std::string& names, std::optional<std::string>& value,
                    const std::string& help) {
  return Option(app_->add_option(names, value, help));
}

Option Verb::option(const std::string& names, std::vector<std::string>& values,
                    const std::string& help) {
  return Option(app_->add_option(names, values, help));
}

Option Verb::option(const std::string& names, int& value, const std::string& help) {
  return Option(app_->add_option(names, value, help));
}

Option Verb::option(const std::string& names, std::uint32_t& value, const std::string& help) {
  return Option(app_->add_option(names, value, help));
}

Option Verb::option(const std::string& names, std::uint64_t& value, const std::string& help) {
  return Option(app_->add_option(names, value, help));
}

Option Verb::option(const std::string& names, const std::string& help) {
  return Option(app_->add_option(names, CLI::callback_t(), help));
}

Option Verb::flag(const std::string& names, bool& given, const std::string& help) {
  return Option(app_->add_flag(names, given, help));
}

Option Verb::flag(const std::string& names, const std::string& help) {
  return Option(app_->add_flag_function(
      names, [](std::int64_t) {}, help));
}

Option Verb::named(const std::string& name) const {
  return Option(app_->get_option(name));
}

void Verb::addToFooter(const std::string& text) {
  app_->footer(app_->get_footer() + text);
}

}  // namespace pelorin::cli
