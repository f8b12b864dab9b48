// What pictures are drawn on: rectangles, lines and texts, in points from the top left corner. One thread.
#pragma once

#include <span>
#include <string>
#include <vector>

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
using Path = std::vector<Point>;

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

struct LineStyle {
  Color color;
  double width = 1;
  bool isDashed = false;
};

class Canvas {
 public:
  virtual ~Canvas() = default;

  virtual void fill(const Rectangle& area, const Color& color) = 0;
  virtual void fill(const Path& polygon, const Color& color) = 0;
  virtual void stroke(std::span<const Path> paths, const LineStyle& style) = 0;

  // Draws `text` (any bytes) with its baseline through `at`.
  virtual void text(Point at, const std::string& text, const TextStyle& style, Align align = Align::kLeft) = 0;
  // Upwards.
  virtual void verticalText(Point centre, const std::string& text, const TextStyle& style) = 0;
  virtual double textWidth(const std::string& text, const TextStyle& style) = 0;

  // Everything drawn until unclip() stays inside `area`.
  virtual void clip(const Rectangle& area) = 0;
  virtual void unclip() = 0;

  void line(Point from, Point to, const LineStyle& style) {
    const Path path = {from, to};
    stroke({&path, 1}, style);
  }
  void hatch(const Rectangle& area, const Color& color);  // diagonal lines
  // `text` shortened with an ellipsis until it is at most `width` wide; empty where not even a letter fits.
  std::string elide(const std::string& text, double width, const TextStyle& style);
};

}  // namespace tools
