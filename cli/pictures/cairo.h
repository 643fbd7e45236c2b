#pragma once

#include <cairo.h>

namespace pelorin::cli {

/// A function of Cairo, whose library is loaded with the first one that is asked for: it and what it
/// needs take as long to load as the rest of the command, and few runs draw.
/// @throws FileError when it cannot be loaded.
void* cairoFunction(const char* name);

// They hide those of the header, which nothing must call: the command is not linked with the library.
#define PELORIN_CAIRO(name)                                                                   \
  struct Loaded_##name {                                                                      \
    template <typename... Arguments>                                                          \
    auto operator()(Arguments... arguments) const -> decltype(::name(arguments...)) {         \
      static const auto function = reinterpret_cast<decltype(&::name)>(cairoFunction(#name)); \
      return function(arguments...);                                                          \
    }                                                                                         \
  };                                                                                          \
  inline constexpr Loaded_##name name

PELORIN_CAIRO(cairo_arc);
PELORIN_CAIRO(cairo_clip);
PELORIN_CAIRO(cairo_close_path);
PELORIN_CAIRO(cairo_create);
PELORIN_CAIRO(cairo_destroy);
PELORIN_CAIRO(cairo_fill);
PELORIN_CAIRO(cairo_fill_preserve);
PELORIN_CAIRO(cairo_get_source);
PELORIN_CAIRO(cairo_get_target);
PELORIN_CAIRO(cairo_identity_matrix);
PELORIN_CAIRO(cairo_image_surface_create);
PELORIN_CAIRO(cairo_image_surface_get_data);
PELORIN_CAIRO(cairo_image_surface_get_height);
PELORIN_CAIRO(cairo_image_surface_get_stride);
PELORIN_CAIRO(cairo_image_surface_get_width);
PELORIN_CAIRO(cairo_line_to);
PELORIN_CAIRO(cairo_move_to);
PELORIN_CAIRO(cairo_new_path);
PELORIN_CAIRO(cairo_new_sub_path);
PELORIN_CAIRO(cairo_paint);
PELORIN_CAIRO(cairo_pattern_add_color_stop_rgb);
PELORIN_CAIRO(cairo_pattern_create_linear);
PELORIN_CAIRO(cairo_pattern_destroy);
PELORIN_CAIRO(cairo_pattern_set_filter);
PELORIN_CAIRO(cairo_rectangle);
PELORIN_CAIRO(cairo_reset_clip);
PELORIN_CAIRO(cairo_restore);
PELORIN_CAIRO(cairo_rotate);
PELORIN_CAIRO(cairo_save);
PELORIN_CAIRO(cairo_scale);
PELORIN_CAIRO(cairo_select_font_face);
PELORIN_CAIRO(cairo_set_antialias);
PELORIN_CAIRO(cairo_set_dash);
PELORIN_CAIRO(cairo_set_font_size);
PELORIN_CAIRO(cairo_set_line_cap);
PELORIN_CAIRO(cairo_set_line_join);
PELORIN_CAIRO(cairo_set_line_width);
PELORIN_CAIRO(cairo_set_source);
PELORIN_CAIRO(cairo_set_source_rgb);
PELORIN_CAIRO(cairo_set_source_rgba);
PELORIN_CAIRO(cairo_set_source_surface);
PELORIN_CAIRO(cairo_show_text);
PELORIN_CAIRO(cairo_status);
PELORIN_CAIRO(cairo_stroke);
PELORIN_CAIRO(cairo_stroke_preserve);
PELORIN_CAIRO(cairo_surface_destroy);
PELORIN_CAIRO(cairo_surface_flush);
PELORIN_CAIRO(cairo_surface_mark_dirty);
PELORIN_CAIRO(cairo_text_extents);
PELORIN_CAIRO(cairo_translate);

#undef PELORIN_CAIRO

}  // namespace pelorin::cli
