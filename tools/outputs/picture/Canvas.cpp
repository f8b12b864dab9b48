#include "tools/outputs/picture/Canvas.h"

#include <cairo.h>

#include <array>
#include <numbers>

#include "tools/text/characters.h"

namespace tools {
namespace {

constexpr double kHatchSpacing = 7;
constexpr char kFont[] = "sans-serif";
constexpr std::array<double, 2> kDash = {3, 3};

}  // namespace

void Canvas::use(const Color& color) {
  cairo_set_source_rgba(context_, color.red, color.green, color.blue, color.alpha);
}

void Canvas::use(const TextStyle& style) {
  cairo_select_font_face(context_, kFont, CAIRO_FONT_SLANT_NORMAL,
                         style.isBold ? CAIRO_FONT_WEIGHT_BOLD : CAIRO_FONT_WEIGHT_NORMAL);
  cairo_set_font_size(context_, style.size);
  use(style.color);
}

void Canvas::trace(const std::vector<Point>& path) {
  cairo_new_path(context_);
  for (const Point& point : path) cairo_line_to(context_, point.x, point.y);
}

void Canvas::fill(const Rectangle& area, const Color& color) {
  use(color);
  cairo_rectangle(context_, area.left, area.top, area.width, area.height);
  cairo_fill(context_);
}

void Canvas::fill(const std::vector<Point>& polygon, const Color& color) {
  use(color);
  trace(polygon);
  cairo_close_path(context_);
  cairo_fill(context_);
}

void Canvas::hatch(const Rectangle& area, const Color& color) {
  clip(area);
  for (double x = area.left - area.height; x < area.right(); x += kHatchSpacing) {
    line({x, area.bottom()}, {x + area.height, area.top}, color);
  }
  unclip();
}

void Canvas::stroke(const std::vector<Point>& path, const Color& color, double width, bool isDashed) {
  use(color);
  cairo_set_line_width(context_, width);
  cairo_set_line_join(context_, CAIRO_LINE_JOIN_ROUND);
  cairo_set_dash(context_, kDash.data(), isDashed ? static_cast<int>(kDash.size()) : 0, 0);
  trace(path);
  cairo_stroke(context_);
}

double Canvas::textWidth(const std::string& text, const TextStyle& style) {
  use(style);
  cairo_text_extents_t extents;
  cairo_text_extents(context_, toValidUtf8(text).c_str(), &extents);
  return extents.x_advance;
}

void Canvas::text(Point at, const std::string& text, const TextStyle& style, Align align) {
  const double width = align == Align::kLeft ? 0 : textWidth(text, style);
  use(style);
  cairo_move_to(context_, at.x - (align == Align::kCentre ? width / 2 : width), at.y);
  cairo_show_text(context_, toValidUtf8(text).c_str());
}

void Canvas::verticalText(Point centre, const std::string& words, const TextStyle& style) {
  cairo_save(context_);
  cairo_translate(context_, centre.x, centre.y);
  cairo_rotate(context_, -std::numbers::pi / 2);
  text({0, 0}, words, style, Align::kCentre);
  cairo_restore(context_);
}

std::string Canvas::elide(const std::string& text, double width, const TextStyle& style) {
  std::string shown = toValidUtf8(text);
  if (textWidth(shown, style) <= width) return shown;
  // Halving finds the longest fitting prefix; the widths of prefixes grow with their length.
  std::size_t fits = 0;
  for (std::size_t tooLong = shown.size(); tooLong - fits > 1;) {
    const std::size_t middle = fits + (tooLong - fits) / 2;
    (textWidth(shown.substr(0, middle) + "\u2026", style) <= width ? fits : tooLong) = middle;
  }
  while (fits > 0 && (static_cast<unsigned char>(shown[fits]) & 0xC0) == 0x80) --fits;
  return fits == 0 ? std::string() : shown.substr(0, fits) + "\u2026";
}

void Canvas::clip(const Rectangle& area) {
  cairo_save(context_);
  cairo_rectangle(context_, area.left, area.top, area.width, area.height);
  cairo_clip(context_);
}

void Canvas::unclip() { cairo_restore(context_); }

}  // namespace tools
