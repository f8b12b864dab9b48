#include "tools/outputs/picture/Canvas.h"

#include "tools/text/characters.h"

namespace tools {
namespace {

constexpr double kHatchSpacing = 7;

}  // namespace

void Canvas::hatch(const Rectangle& area, const Color& color) {
  std::vector<Path> lines;
  for (double x = area.left - area.height; x < area.right(); x += kHatchSpacing) {
    lines.push_back({{x, area.bottom()}, {x + area.height, area.top}});
  }
  clip(area);
  stroke(lines, {color});
  unclip();
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

}  // namespace tools
