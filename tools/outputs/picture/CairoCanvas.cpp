#include "tools/outputs/picture/CairoCanvas.h"

#include <cairo.h>

#include <array>
#include <numbers>

#include "tools/text/characters.h"

namespace tools {
namespace {

constexpr char kFont[] = "sans-serif";
constexpr std::array<double, 2> kDash = {3, 3};

}  // namespace

void CairoCanvas::use(const Color& color) {
  cairo_set_source_rgba(context_, color.red, color.green, color.blue, color.alpha);
}

void CairoCanvas::use(const TextStyle& style) {
  cairo_select_font_face(context_, kFont, CAIRO_FONT_SLANT_NORMAL,
                         style.isBold ? CAIRO_FONT_WEIGHT_BOLD : CAIRO_FONT_WEIGHT_NORMAL);
  cairo_set_font_size(context_, style.size);
  use(style.color);
}

void CairoCanvas::trace(const Path& path) {
  cairo_new_sub_path(context_);
  for (const Point& point : path) cairo_line_to(context_, point.x, point.y);
}

void CairoCanvas::fill(const Rectangle& area, const Color& color) {
  use(color);
  cairo_rectangle(context_, area.left, area.top, area.width, area.height);
  cairo_fill(context_);
}

void CairoCanvas::fill(const Path& polygon, const Color& color) {
  use(color);
  trace(polygon);
  cairo_close_path(context_);
  cairo_fill(context_);
}

void CairoCanvas::stroke(std::span<const Path> paths, const LineStyle& style) {
  use(style.color);
  cairo_set_line_width(context_, style.width);
  cairo_set_line_join(context_, CAIRO_LINE_JOIN_ROUND);
  cairo_set_dash(context_, kDash.data(), style.isDashed ? static_cast<int>(kDash.size()) : 0, 0);
  for (const Path& path : paths) trace(path);
  cairo_stroke(context_);
}

double CairoCanvas::textWidth(const std::string& text, const TextStyle& style) {
  use(style);
  cairo_text_extents_t extents;
  cairo_text_extents(context_, toValidUtf8(text).c_str(), &extents);
  return extents.x_advance;
}

void CairoCanvas::text(Point at, const std::string& text, const TextStyle& style, Align align) {
  const double width = align == Align::kLeft ? 0 : textWidth(text, style);
  use(style);
  cairo_move_to(context_, at.x - (align == Align::kCentre ? width / 2 : width), at.y);
  cairo_show_text(context_, toValidUtf8(text).c_str());
}

void CairoCanvas::verticalText(Point centre, const std::string& words, const TextStyle& style) {
  cairo_save(context_);
  cairo_translate(context_, centre.x, centre.y);
  cairo_rotate(context_, -std::numbers::pi / 2);
  text({0, 0}, words, style, Align::kCentre);
  cairo_restore(context_);
}

void CairoCanvas::clip(const Rectangle& area) {
  cairo_save(context_);
  cairo_rectangle(context_, area.left, area.top, area.width, area.height);
  cairo_clip(context_);
}

void CairoCanvas::unclip() { cairo_restore(context_); }

}  // namespace tools
