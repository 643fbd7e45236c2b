// What stands in for functions of the C library that would bring floating point of 128 bits and what nobody
// asks for: numbers as text and back, and the texts of errors.
#include <cstdarg>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>

#include "decimal.h"

extern "C" {

double strtod(const char* text, char** end) {
  return wasm::readNumber(text, end, wasm::doublePrecision);
}

float strtof(const char* text, char** end) {
  return static_cast<float>(wasm::readNumber(text, end, wasm::floatPrecision));
}

long double strtold(const char* text, char** end) {
  return strtod(text, end);
}

// There is one locale.
locale_t newlocale(int, const char*, locale_t) {
  static char one;
  return reinterpret_cast<locale_t>(&one);
}

double strtod_l(const char* text, char** end, locale_t) {
  return strtod(text, end);
}

float strtof_l(const char* text, char** end, locale_t) {
  return strtof(text, end);
}

long double strtold_l(const char* text, char** end, locale_t) {
  return strtod(text, end);
}

/// Whole numbers, texts and letters, with widths: what libraries' errors are made of.
int vsnprintf(char* to, std::size_t room, const char* format, va_list arguments) {
  std::size_t length = 0;
  const auto put = [&](char letter) {
    if (length + 1 < room) to[length] = letter;
    ++length;
  };
  for (; *format != 0; ++format) {
    if (*format != '%') {
      put(*format);
      continue;
    }
    ++format;
    const char fill = *format == '0' ? '0' : ' ';
    std::size_t width = 0;
    for (; *format >= '0' && *format <= '9'; ++format)
      width = 10 * width + static_cast<unsigned>(*format - '0');
    while (*format == 'l' || *format == 'z') ++format;  // all of 32 bits
    char digits[16];
    const char* text = digits;
    std::size_t size = 0;
    switch (*format) {
      case 's':
        text = va_arg(arguments, const char*);
        size = std::strlen(text);
        break;
      case 'c':
        digits[size++] = static_cast<char>(va_arg(arguments, int));
        break;
      case 'd':
      case 'u':
      case 'x':
      case 'X': {
        auto value = va_arg(arguments, unsigned);
        const bool negative = *format == 'd' && static_cast<int>(value) < 0;
        if (negative) value = 0 - value;
        const unsigned base = *format == 'x' || *format == 'X' ? 16 : 10;
        const char* const names = *format == 'X' ? "0123456789ABCDEF" : "0123456789abcdef";
        char* first = digits + sizeof digits;
        do *--first = names[value % base];
        while ((value /= base) != 0);
        if (negative) *--first = '-';
        text = first;
        size = static_cast<std::size_t>(digits + sizeof digits - first);
        break;
      }
      default:  // %%, and what is not known stays as it is
        if (*format != 0) digits[size++] = *format;
        if (*format == 0) --format;
    }
    for (std::size_t i = size; i < width; ++i) put(fill);
    for (std::size_t i = 0; i < size; ++i) put(text[i]);
  }
  if (room > 0) to[length < room ? length : room - 1] = 0;
  return static_cast<int>(length);
}

int snprintf(char* to, std::size_t room, const char* format, ...) {
  va_list arguments;
  va_start(arguments, format);
  const int length = vsnprintf(to, room, format, arguments);
  va_end(arguments);
  return length;
}

// There is no environment.
char* getenv(const char*) {
  return nullptr;
}

// Nobody reads what a module says to a terminal.
#undef stderr
FILE* const stderr = nullptr;

int vfprintf(FILE*, const char*, va_list) {
  return 0;
}

int fprintf(FILE*, const char*, ...) {
  return 0;
}

int fiprintf(FILE*, const char*, ...) {
  return 0;
}

[[noreturn]] void abort_message(const char*, ...) {
  std::abort();
}

}  // extern "C"
