#pragma once

#include <locale>
#include <string>

namespace pelorin::test_support {

/// Writes 1234.5 as "1.234,5" and has words of its own for booleans.
class CommaPunctuation : public std::numpunct<char> {
  char do_decimal_point() const override { return ','; }
  char do_thousands_sep() const override { return '.'; }
  std::string do_grouping() const override { return "\3"; }
  std::string do_truename() const override { return "wahr"; }
  std::string do_falsename() const override { return "falsch"; }
};

/// The global locale with such punctuation, as long as this lives.
class CommaLocale {
 public:
  CommaLocale()
      : before_(std::locale::global(std::locale(std::locale::classic(), new CommaPunctuation))) {}
  ~CommaLocale() { std::locale::global(before_); }

 private:
  std::locale before_;
};

}  // namespace pelorin::test_support
