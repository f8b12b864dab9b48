// A canvas that becomes an SVG document whose texts are texts: they can be searched, selected and read aloud. Which
// font shows them is the viewer's choice, so that widths are those of an ordinary sans serif with some reserve; the
// document is the same on every machine. One thread.
#pragma once

#include "tools/outputs/picture/Canvas.h"

namespace tools {

class SvgCanvas final : public Canvas {
 public:
  // `title` is what the picture is called where it cannot be seen.
  SvgCanvas(double width, double height, const std::string& title);

  using Canvas::fill;
  void fill(const Rectangle& area, const Color& color) override;
  void fill(const Path& polygon, const Color& color) override;
  void stroke(std::span<const Path> paths, const LineStyle& style) override;
  void text(Point at, const std::string& text, const TextStyle& style, Align align) override;
  void verticalText(Point centre, const std::string& text, const TextStyle& style) override;
  double textWidth(const std::string& text, const TextStyle& style) override;
  void clip(const Rectangle& area) override;
  void unclip() override;

  // The whole document. Call it once, last.
  std::string finish();

 private:
  void addNumber(double value);
  void addPair(Point point);
  void addPath(const Path& path);
  void addColor(const char* attribute, const Color& color);
  void addText(const std::string& text, const TextStyle& style, Align align);

  std::string document_;
  int clips_ = 0;
};

}  // namespace tools
