#include "tools/outputs/picture/SvgCanvas.h"

#include <array>
#include <charconv>
#include <cmath>
#include <cstdint>

#include "tools/text/characters.h"

namespace tools {
namespace {

// Advance widths of ' ' to '~' in a sans serif, thousandths of the size.
constexpr std::array<std::uint16_t, 95> kWidths = {
    278, 278, 355, 556, 556, 889, 667, 191, 333, 333, 389, 584, 278, 333,  278, 278, 556, 556, 556,
    556, 556, 556, 556, 556, 556, 556, 278, 278, 584, 584, 584, 556, 1015, 667, 667, 722, 722, 667,
    611, 778, 722, 278, 500, 667, 556, 833, 722, 778, 667, 778, 722, 667,  611, 722, 667, 944, 667,
    667, 611, 278, 278, 278, 469, 556, 333, 556, 556, 500, 556, 556, 278,  556, 556, 222, 222, 500,
    222, 833, 556, 556, 556, 556, 333, 500, 278, 556, 500, 722, 500, 500,  500, 334, 260, 334, 584};
constexpr double kReserve = 1.14;  // for fonts that run wider
constexpr double kBolder = 1.08;
constexpr double kOther = 0.6;  // of the size, characters beyond those
constexpr double kWide = 1;     // and those that take two columns of a terminal
constexpr char32_t kThinSpace = 0x2009;

double advanceOf(char32_t character) {
  if (character >= ' ' && character <= '~') return kWidths[character - ' '] / 1000.0;
  if (character == kThinSpace) return 0.2;
  const int columns = displayWidth(character);
  return columns == 0 ? 0 : columns == 2 ? kWide : kOther;
}

// XML has no U+FFFE and U+FFFF.
std::string toXmlCharacters(const std::string& text) {
  std::string shown = toPrintable(text);
  for (const char* const none : {"\uFFFE", "\uFFFF"}) {
    for (std::size_t at = 0; (at = shown.find(none, at)) != std::string::npos;) shown.replace(at, 3, "\uFFFD");
  }
  return shown;
}

void appendEscaped(std::string& document, const std::string& text) {
  for (const char c : toXmlCharacters(text)) {
    switch (c) {
      case '&':
        document += "&amp;";
        break;
      case '<':
        document += "&lt;";
        break;
      case '>':
        document += "&gt;";
        break;
      default:
        document += c == '\t' ? ' ' : c;
    }
  }
}

}  // namespace

SvgCanvas::SvgCanvas(double width, double height, const std::string& title) {
  document_ = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<svg xmlns=\"http://www.w3.org/2000/svg\" width=\"";
  addNumber(width);
  document_ += "pt\" height=\"";
  addNumber(height);
  document_ += "pt\" viewBox=\"0 0 ";
  addPair({width, height});
  document_ += "\" role=\"img\" font-family=\"sans-serif\" stroke-linejoin=\"round\">\n<title>";
  appendEscaped(document_, title);
  document_ += "</title>\n";
}

void SvgCanvas::addNumber(double value) {
  std::array<char, 64> buffer;
  const double shown = std::abs(value) < 0.005 ? 0 : value;
  const auto end = std::to_chars(buffer.data(), buffer.data() + buffer.size(), shown, std::chars_format::fixed, 2);
  const char* last = end.ptr;
  while (last[-1] == '0') --last;
  if (last[-1] == '.') --last;
  document_.append(buffer.data(), static_cast<std::size_t>(last - buffer.data()));
}

void SvgCanvas::addPair(Point point) {
  addNumber(point.x);
  document_ += ' ';
  addNumber(point.y);
}

void SvgCanvas::addPath(const Path& path) {
  char command = 'M';
  for (const Point& point : path) {
    document_ += command;
    addPair(point);
    command = 'L';
  }
}

void SvgCanvas::addColor(const char* attribute, const Color& color) {
  constexpr char kDigits[] = "0123456789abcdef";
  document_ += std::string(" ") + attribute + "=\"#";
  for (const double part : {color.red, color.green, color.blue}) {
    const auto level = static_cast<unsigned>(std::lround(part * 255));
    document_ += {kDigits[level >> 4], kDigits[level & 0xF]};
  }
  document_ += '"';
  if (color.alpha == 1) return;
  document_ += std::string(" ") + attribute + "-opacity=\"";
  addNumber(color.alpha);
  document_ += '"';
}

void SvgCanvas::fill(const Rectangle& area, const Color& color) {
  document_ += "<rect x=\"";
  addNumber(area.left);
  document_ += "\" y=\"";
  addNumber(area.top);
  document_ += "\" width=\"";
  addNumber(area.width);
  document_ += "\" height=\"";
  addNumber(area.height);
  document_ += '"';
  addColor("fill", color);
  document_ += "/>\n";
}

void SvgCanvas::fill(const Path& polygon, const Color& color) {
  document_ += "<path d=\"";
  addPath(polygon);
  document_ += "Z\"";
  addColor("fill", color);
  document_ += "/>\n";
}

void SvgCanvas::stroke(std::span<const Path> paths, const LineStyle& style) {
  document_ += "<path d=\"";
  for (const Path& path : paths) addPath(path);
  document_ += "\" fill=\"none\"";
  addColor("stroke", style.color);
  if (style.width != 1) {
    document_ += " stroke-width=\"";
    addNumber(style.width);
    document_ += '"';
  }
  document_ += style.isDashed ? " stroke-dasharray=\"3\"/>\n" : "/>\n";
}

void SvgCanvas::addText(const std::string& text, const TextStyle& style, Align align) {
  document_ += " font-size=\"";
  addNumber(style.size);
  document_ += style.isBold ? "\" font-weight=\"bold\"" : "\"";
  if (align != Align::kLeft) document_ += align == Align::kCentre ? " text-anchor=\"middle\"" : " text-anchor=\"end\"";
  addColor("fill", style.color);
  document_ += '>';
  appendEscaped(document_, text);
  document_ += "</text>\n";
}

void SvgCanvas::text(Point at, const std::string& text, const TextStyle& style, Align align) {
  document_ += "<text x=\"";
  addNumber(at.x);
  document_ += "\" y=\"";
  addNumber(at.y);
  document_ += '"';
  addText(text, style, align);
}

void SvgCanvas::verticalText(Point centre, const std::string& text, const TextStyle& style) {
  document_ += "<text transform=\"translate(";
  addPair(centre);
  document_ += ") rotate(-90)\"";
  addText(text, style, Align::kCentre);
}

double SvgCanvas::textWidth(const std::string& text, const TextStyle& style) {
  double advance = 0;
  for (const char32_t character : toCharacters(text)) advance += advanceOf(character);
  return advance * style.size * kReserve * (style.isBold ? kBolder : 1);
}

void SvgCanvas::clip(const Rectangle& area) {
  const std::string name = "clip" + std::to_string(clips_++);
  document_ += "<clipPath id=\"" + name + "\"><path d=\"";
  addPath({{area.left, area.top}, {area.right(), area.top}, {area.right(), area.bottom()}, {area.left, area.bottom()}});
  document_ += "Z\"/></clipPath>\n<g clip-path=\"url(#" + name + ")\">\n";
}

void SvgCanvas::unclip() { document_ += "</g>\n"; }

std::string SvgCanvas::finish() { return std::move(document_) + "</svg>\n"; }

}  // namespace tools
