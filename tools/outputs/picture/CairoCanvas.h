// A canvas over a cairo context, which is borrowed. One thread.
#pragma once

#include "tools/outputs/picture/Canvas.h"

typedef struct _cairo cairo_t;

namespace tools {

class CairoCanvas final : public Canvas {
 public:
  explicit CairoCanvas(cairo_t* context) : context_(context) {}

  using Canvas::fill;
  void fill(const Rectangle& area, const Color& color) override;
  void fill(const Path& polygon, const Color& color) override;
  void stroke(std::span<const Path> paths, const LineStyle& style) override;
  void text(Point at, const std::string& text, const TextStyle& style, Align align) override;
  void verticalText(Point centre, const std::string& text, const TextStyle& style) override;
  double textWidth(const std::string& text, const TextStyle& style) override;
  void clip(const Rectangle& area) override;
  void unclip() override;

 private:
  void use(const Color& color);
  void use(const TextStyle& style);
  void trace(const Path& path);

  cairo_t* context_;
};

}  // namespace tools
