#pragma once

#include <string>
#include <string_view>

#include "cli/pictures/canvas.h"

namespace pelorin::cli {

enum class Align { left, centre, right };

struct TextStyle {
  double size;  ///< Of the letters' em, in units of the drawing.
  Colour colour = {0.13, 0.14, 0.16};
  bool bold = false;
};

/// `text` with control characters and bytes that are not UTF-8 replaced by U+FFFD: file names are
/// any bytes, and Cairo draws nothing more after one invalid string.
std::string printable(std::string_view text);

/// Draws one line of text, any bytes, from, around or up to `x`, standing on `baseline`.
void drawText(cairo_t* context, std::string_view text, double x, double baseline,
              const TextStyle& style, Align align = Align::left);

/// How far `text` advances, in units of the drawing.
double textWidth(cairo_t* context, std::string_view text, const TextStyle& style);

/// `text` itself when it fits `width`, otherwise its beginning and its end (where file names
/// differ) with an ellipsis between them; never wider unless the ellipsis alone is.
std::string shortenedToWidth(cairo_t* context, std::string_view text, const TextStyle& style,
                             double width);

}  // namespace pelorin::cli
