#include "cli/pictures/text.h"

#include <cstddef>
#include <cstdint>
#include <vector>

#include "cli/frame/shown_text.h"

namespace pelorin::cli {
namespace {

constexpr std::string_view replacement = "\xEF\xBF\xBD";
constexpr std::string_view ellipsis = "\xE2\x80\xA6";

void select(cairo_t* context, const TextStyle& style) {
  cairo_select_font_face(context, "DejaVu Sans", CAIRO_FONT_SLANT_NORMAL,
                         style.bold ? CAIRO_FONT_WEIGHT_BOLD : CAIRO_FONT_WEIGHT_NORMAL);
  cairo_set_font_size(context, style.size);
}

double widthOf(cairo_t* context, const std::string& text) {
  cairo_text_extents_t extents;
  cairo_text_extents(context, text.c_str(), &extents);
  return extents.x_advance;
}

}  // namespace

std::string printable(std::string_view text) {
  std::string result;
  while (!text.empty()) {
    const std::size_t length = characterLength(text);
    const auto first = static_cast<std::uint8_t>(text[0]);
    const bool visible = length != 0 && first >= 0x20 && first != 0x7F;
    result += visible ? text.substr(0, length) : replacement;
    text.remove_prefix(length == 0 ? 1 : length);
  }
  return result;
}

void drawText(cairo_t* context, std::string_view text, double x, double baseline,
              const TextStyle& style, Align align) {
  const std::string line = printable(text);
  select(context, style);
  setColour(context, style.colour);
  const double shift = align == Align::left ? 0 : align == Align::centre ? 0.5 : 1;
  const double width = shift == 0 ? 0 : widthOf(context, line);
  cairo_move_to(context, x - shift * width, baseline);
  cairo_show_text(context, line.c_str());
  cairo_new_path(context);
}

double textWidth(cairo_t* context, std::string_view text, const TextStyle& style) {
  select(context, style);
  return widthOf(context, printable(text));
}

std::string shortenedToWidth(cairo_t* context, std::string_view text, const TextStyle& style,
                             double width) {
  const std::string line = printable(text);
  select(context, style);
  if (widthOf(context, line) <= width) return line;
  std::vector<std::size_t> starts;  // of its characters, and the end
  for (std::size_t i = 0; i < line.size(); i += characterLength(std::string_view(line).substr(i)))
    starts.push_back(i);
  starts.push_back(line.size());
  const std::size_t characters = starts.size() - 1;
  const auto keeping = [&](std::size_t kept) {
    return line.substr(0, starts[kept - kept / 2]).append(ellipsis) +
           line.substr(starts[characters - kept / 2]);
  };
  std::size_t fits = 0;
  for (std::size_t tooMany = characters; fits + 1 < tooMany;) {
    const std::size_t middle = (fits + tooMany) / 2;
    (widthOf(context, keeping(middle)) <= width ? fits : tooMany) = middle;
  }
  return keeping(fits);
}

}  // namespace pelorin::cli
