// Drawing primitives in points from the top left corner, over a cairo context that is borrowed.
#pragma once

#include <string>
#include <vector>

typedef struct _cairo cairo_t;

namespace tools {

struct Color {
  double red, green, blue;
  double alpha = 1;
};
// From 0xRRGGBB.
constexpr Color rgb(unsigned value, double alpha = 1) {
  return {(value >> 16 & 0xFF) / 255.0, (value >> 8 & 0xFF) / 255.0, (value & 0xFF) / 255.0, alpha};
}

struct Point {
  double x, y;
};

struct Rectangle {
  double left, top, width, height;
  double right() const { return left + width; }
  double bottom() const { return top + height; }
  double middle() const { return top + height / 2; }
};

enum class Align { kLeft, kCentre, kRight };

struct TextStyle {
  double size;
  Color color;
  bool isBold = false;
};

class Canvas {
 public:
  explicit Canvas(cairo_t* context) : context_(context) {}

  void fill(const Rectangle& area, const Color& color);
  void fill(const std::vector<Point>& polygon, const Color& color);
  void hatch(const Rectangle& area, const Color& color);  // diagonal lines
  void stroke(const std::vector<Point>& path, const Color& color, double width, bool isDashed = false);
  void line(Point from, Point to, const Color& color, double width = 1) { stroke({from, to}, color, width); }

  // Draws `text` (any bytes) with its baseline through `at`.
  void text(Point at, const std::string& text, const TextStyle& style, Align align = Align::kLeft);
  void verticalText(Point centre, const std::string& text, const TextStyle& style);
  double textWidth(const std::string& text, const TextStyle& style);
  // `text` shortened with an ellipsis until it is at most `width` wide; empty where not even a letter fits.
  std::string elide(const std::string& text, double width, const TextStyle& style);

  // Everything drawn until unclip() stays inside `area`.
  void clip(const Rectangle& area);
  void unclip();

 private:
  void use(const Color& color);
  void use(const TextStyle& style);
  void trace(const std::vector<Point>& path);

  cairo_t* context_;
};

}  // namespace tools
