#include "decimal.h"

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>

namespace wasm {
namespace {

/// A natural number of at most 8192 bits; what a conversion needs is less than 5000.
class Natural {
 public:
  void multiplyAdd(std::uint32_t factor, std::uint32_t summand) {
    std::uint64_t carry = summand;
    for (int i = 0; i < size_; ++i) {
      carry += std::uint64_t{words_[i]} * factor;
      words_[i] = static_cast<std::uint32_t>(carry);
      carry >>= 32;
    }
    if (carry != 0) words_[size_++] = static_cast<std::uint32_t>(carry);
  }

  /// @returns the remainder.
  std::uint32_t divide(std::uint32_t divisor) {
    std::uint64_t rest = 0;
    for (int i = size_; i-- > 0;) {
      rest = rest << 32 | words_[i];
      words_[i] = static_cast<std::uint32_t>(rest / divisor);
      rest %= divisor;
    }
    while (size_ > 0 && words_[size_ - 1] == 0) --size_;
    return static_cast<std::uint32_t>(rest);
  }

  void shiftWords(int count) {
    std::copy_backward(words_, words_ + size_, words_ + size_ + count);
    std::fill(words_, words_ + count, 0);
    size_ += count;
  }

  bool isZero() const { return size_ == 0; }

  /// The highest 64 bits, the first of them set, and what they are multiplied by, as a power of 2.
  /// @param rest  set when there are lower bits.
  std::uint64_t highest(int& exponent, bool& rest) const {
    const auto word = [&](int i) { return i >= 0 ? words_[i] : 0u; };
    const int shift = std::countl_zero(words_[size_ - 1]);
    std::uint64_t top = std::uint64_t{word(size_ - 1)} << 32 | word(size_ - 2);
    const std::uint32_t next = word(size_ - 3);
    if (shift > 0) top = top << shift | next >> (32 - shift);
    rest |= static_cast<std::uint32_t>(next << shift) != 0;
    for (int i = 0; i < size_ - 3; ++i) rest |= words_[i] != 0;
    exponent = 32 * (size_ - 2) - shift;
    return top;
  }

 private:
  std::uint32_t words_[256];
  int size_ = 0;
};

/// top * 2^exponent, rounded to the nearest number, of two to the even one.
/// @param top   its first bit is set.
/// @param rest  there is something beyond top.
double rounded(std::uint64_t top, int exponent, bool rest, Precision precision) {
  const int lowest = std::max(exponent + 64 - precision.bits, precision.lowest);
  const int dropped = lowest - exponent;  // 11 at least
  if (dropped > 64) return 0;
  std::uint64_t kept = dropped == 64 ? 0 : top >> dropped;
  const std::uint64_t half = std::uint64_t{1} << (dropped - 1);
  const std::uint64_t below = dropped == 64 ? top : top & (2 * half - 1);
  if (below > half || (below == half && (rest || kept % 2 == 1))) ++kept;
  return std::ldexp(static_cast<double>(kept), lowest);
}

bool isDigit(char letter) {
  return letter >= '0' && letter <= '9';
}

char lower(char letter) {
  return letter >= 'A' && letter <= 'Z' ? static_cast<char>(letter + ('a' - 'A')) : letter;
}

/// -1 for what is none.
int hexadecimal(char letter) {
  if (isDigit(letter)) return letter - '0';
  letter = lower(letter);
  return letter >= 'a' && letter <= 'f' ? letter - 'a' + 10 : -1;
}

/// Goes past a word, whatever its case. @returns whether it is there.
bool skipWord(const char*& at, const char* word) {
  const char* letter = at;
  for (; *word != 0; ++letter, ++word) {
    if (lower(*letter) != *word) return false;
  }
  at = letter;
  return true;
}

/// Adds what follows a mark of an exponent, if a number does.
void readExponent(const char*& at, char mark, int& exponent) {
  if (lower(*at) != mark) return;
  const char* digit = at + 1;
  const bool negative = *digit == '-';
  if (negative || *digit == '+') ++digit;
  if (!isDigit(*digit)) return;
  int value = 0;
  for (; isDigit(*digit); ++digit) value = std::min(value * 10 + (*digit - '0'), 100'000'000);
  exponent += negative ? -value : value;
  at = digit;
}

/// @param at  on the first digit or the point before it.
double readHexadecimal(const char*& at, Precision precision) {
  std::uint64_t top = 0;
  int exponent = 0;
  bool rest = false, point = false;
  for (;; ++at) {
    if (*at == '.' && !point) {
      point = true;
      continue;
    }
    const int digit = hexadecimal(*at);
    if (digit < 0) break;
    if (top >> 60 == 0) {
      top = top << 4 | static_cast<unsigned>(digit);
      exponent -= point ? 4 : 0;
    } else {
      rest |= digit != 0;
      exponent += point ? 0 : 4;
    }
  }
  readExponent(at, 'p', exponent);
  if (top == 0) return 0;
  const int shift = std::countl_zero(top);
  return rounded(top << shift, exponent - shift, rest, precision);
}

/// @param at  on the first digit or the point before it.
double readDecimal(const char*& at, Precision precision) {
  constexpr int mostDigits = 800;  // halfway between two numbers lies none of more
  Natural number;
  int digits = 0, exponent = 0;
  bool rest = false, point = false;
  for (;; ++at) {
    if (*at == '.' && !point) {
      point = true;
      continue;
    }
    if (!isDigit(*at)) break;
    const int digit = *at - '0';
    if (digits < mostDigits) {
      number.multiplyAdd(10, static_cast<unsigned>(digit));
      digits += number.isZero() ? 0 : 1;
      exponent -= point ? 1 : 0;
    } else {
      rest |= digit != 0;
      exponent += point ? 0 : 1;
    }
  }
  readExponent(at, 'e', exponent);
  if (number.isZero() || digits + exponent < -330) return 0;
  if (digits + exponent > 310) return std::numeric_limits<double>::infinity();
  for (; exponent > 0; --exponent) number.multiplyAdd(10, 0);
  // Room for 64 bits of what is left after the divisions, each of which takes less than four.
  const int words = exponent < 0 ? -exponent / 8 + 3 : 0;
  number.shiftWords(words);
  for (; exponent < 0; ++exponent) rest |= number.divide(10) != 0;
  int scale = 0;
  const std::uint64_t top = number.highest(scale, rest);
  return rounded(top, scale - 32 * words, rest, precision);
}

}  // namespace

double readNumber(const char* text, char** end, Precision precision) {
  const char* at = text;
  while (*at == ' ' || (*at >= '\t' && *at <= '\r')) ++at;
  const bool negative = *at == '-';
  if (negative || *at == '+') ++at;
  double value = 0;
  const auto startsNumber = [](const char* first, auto isDigitOf) {
    return isDigitOf(*first) || (*first == '.' && isDigitOf(first[1]));
  };
  if (*at == '0' && lower(at[1]) == 'x' &&
      startsNumber(at + 2, [](char letter) { return hexadecimal(letter) >= 0; })) {
    at += 2;
    value = readHexadecimal(at, precision);
  } else if (startsNumber(at, isDigit)) {
    value = readDecimal(at, precision);
  } else if (skipWord(at, "inf")) {
    skipWord(at, "inity");
    value = std::numeric_limits<double>::infinity();
  } else if (skipWord(at, "nan")) {
    value = std::numeric_limits<double>::quiet_NaN();
    const char* inside = at;
    if (*inside == '(') {
      do ++inside;
      while (isDigit(*inside) || *inside == '_' ||
             (lower(*inside) >= 'a' && lower(*inside) <= 'z'));
      if (*inside == ')') at = inside + 1;
    }
  } else {
    if (end != nullptr) *end = const_cast<char*>(text);
    return 0;
  }
  if (end != nullptr) *end = const_cast<char*>(at);
  return negative ? -value : value;
}

std::string writeNumber(double value, Style style, int precision) {
  std::string text = std::signbit(value) ? "-" : "";
  if (!std::isfinite(value)) return text + (std::isnan(value) ? "nan" : "inf");

  // All digits of the number, which is a natural one over a power of 10.
  int exponent = 0;
  const auto mantissa =
      static_cast<std::uint64_t>(std::ldexp(std::frexp(std::abs(value), &exponent), 53));
  exponent -= 53;
  Natural number;
  number.multiplyAdd(0, static_cast<std::uint32_t>(mantissa >> 32));
  if (!number.isZero()) number.shiftWords(1);
  number.multiplyAdd(1, static_cast<std::uint32_t>(mantissa));
  for (int i = exponent; i > 0; --i) number.multiplyAdd(2, 0);
  for (int i = exponent; i < 0; ++i) number.multiplyAdd(5, 0);
  std::string digits;
  while (!number.isZero()) digits.push_back(static_cast<char>('0' + number.divide(10)));
  std::reverse(digits.begin(), digits.end());
  int point = static_cast<int>(digits.size()) + std::min(exponent, 0);  // digits before it
  if (digits.empty()) point = 1;

  // So many of them, of two nearest numbers the even one. What is missing, also before the first, is 0.
  const auto round = [&](int count) {
    if (count < 0) {
      digits.clear();
    } else if (count < static_cast<int>(digits.size())) {
      const bool odd = count > 0 && (digits[count - 1] - '0') % 2 == 1;
      const bool more = digits.find_first_not_of('0', count + 1) != digits.npos;
      const bool up = digits[count] > '5' || (digits[count] == '5' && (odd || more));
      digits.resize(count);
      if (up) {
        int i = count;
        while (i > 0 && digits[i - 1] == '9') digits[--i] = '0';
        if (i > 0) {
          ++digits[i - 1];
        } else {
          digits.insert(0, "1");
          ++point;
        }
      }
    }
  };
  const auto digit = [&](int i) {
    return i >= 0 && i < static_cast<int>(digits.size()) ? digits[i] : '0';
  };

  if (style == Style::general) precision = std::max(precision, 1) - 1;
  if (style == Style::fixed) {
    round(point + precision);
  } else {
    round(precision + 1);
  }
  bool scientific = style == Style::scientific;
  if (style == Style::general) {
    scientific = point - 1 < -4 || point - 1 > precision;
    const std::size_t last = digits.find_last_not_of('0');
    const int left = last == digits.npos ? 1 : static_cast<int>(last) + 1;
    precision = std::max(0, scientific ? left - 1 : left - point);
  }
  const int first = scientific ? 0 : std::min(point - 1, 0);  // a digit before the point at least
  const int whole = scientific ? 1 : std::max(point, 1);
  for (int i = 0; i < whole; ++i) text += digit(first + i);
  if (precision > 0) text += '.';
  for (int i = 0; i < precision; ++i) text += digit(first + whole + i);
  if (scientific) {
    const int power = point - 1;
    text += power < 0 ? "e-" : "e+";
    const std::string written = std::to_string(std::abs(power));
    if (written.size() < 2) text += '0';
    text += written;
  }
  return text;
}

}  // namespace wasm
