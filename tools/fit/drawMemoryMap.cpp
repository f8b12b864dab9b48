#include "tools/fit/drawMemoryMap.h"

#include <algorithm>
#include <cmath>

#include "tools/fit/describeMemory.h"
#include "tools/text/characters.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

// Pixels.
constexpr double kWidth = 960;
constexpr double kMargin = 24;
constexpr double kBarWidth = kWidth - 2 * kMargin;
constexpr double kBarHeight = 44;
constexpr double kZoomGap = 44;  // between the bars
constexpr double kRowHeight = 17;
constexpr double kCharacterWidth = 6.4;  // at 11 pixels, on the safe side
constexpr double kNarrowestBorder = 3;   // narrower blocks would be all border
constexpr std::size_t kMostRowsInOneColumn = 24;

// A table's column, from its left edge.
constexpr double kTableWidth = 444;
constexpr double kNameLeft = 16;
constexpr double kFirstByteRight = 212;
constexpr double kBytesRight = 298;
constexpr double kSamplesRight = 380;
constexpr int kNameColumns = 17;

constexpr std::string_view kFills[] = {"#cfe3f5", "#fde2c4", "#d5ecd0", "#eddcf2", "#f8d5d3", "#e4e0cf"};
constexpr std::string_view kHoleFill = "url(#hole)";

constexpr std::string_view kHead = R"SVG(<defs>
<pattern id="hole" width="6" height="6" patternUnits="userSpaceOnUse" patternTransform="rotate(45)">
<rect width="6" height="6" fill="#ffffff"/><line x1="0" y1="0" x2="0" y2="6" stroke="#c8c8c8" stroke-width="1.5"/>
</pattern>
</defs>
)SVG";

std::string number(double value) { return formatNumber(std::round(100 * value) / 100); }

std::string escape(std::string_view text) {
  std::string escaped;
  for (const char c : toPrintable(text)) {
    switch (c) {
      case '&':
        escaped += "&amp;";
        break;
      case '<':
        escaped += "&lt;";
        break;
      case '>':
        escaped += "&gt;";
        break;
      default:
        escaped += c;
    }
  }
  return escaped;
}

// As much of the text as so many columns hold, with a mark where some is left out; nothing where that says too little.
std::string elide(const std::string& text, int columns) {
  constexpr int kLeastColumns = 6;
  std::string printable = toPrintable(text);
  if (cutToWidth(printable, columns) == printable) return printable;
  return columns < kLeastColumns ? "" : cutToWidth(printable, columns - 1) + "\u2026";
}

class Picture {
 public:
  Picture(const Fit& fit, const MemoryMap& map) : map_(map), sampleRateHz_(fit.generator.sampleRateHz) {}

  std::string draw(const std::string& title) {
    drawHeading(title);
    drawBars();
    drawTable();
    const std::string size = "width=\"" + number(kWidth) + "\" height=\"" + number(y_ + kMargin) + "\"";
    return "<svg xmlns=\"http://www.w3.org/2000/svg\" " + size + " viewBox=\"0 0 " + number(kWidth) + " " +
           number(y_ + kMargin) + "\" font-family=\"sans-serif\" font-size=\"11\" fill=\"#1a1a1a\">\n<title>" +
           escape(title) + "</title>\n" + std::string(kHead) +
           "<rect width=\"100%\" height=\"100%\" fill=\"#ffffff\"/>\n" + body_ + "</svg>\n";
  }

 private:
  void drawText(double x, double y, std::string_view text, std::string_view attributes = {}) {
    if (text.empty()) return;
    body_ += "<text x=\"" + number(x) + "\" y=\"" + number(y) + "\"" + std::string(attributes) + ">" + escape(text) +
             "</text>\n";
  }
  void drawBox(double x, double y, double width, double height, std::string_view fill) {
    body_ += "<rect x=\"" + number(x) + "\" y=\"" + number(y) + "\" width=\"" + number(width) + "\" height=\"" +
             number(height) + "\" fill=\"" + std::string(fill) + "\"";
    body_ += width >= kNarrowestBorder ? " stroke=\"#555555\" stroke-width=\"0.75\"/>\n" : "/>\n";
  }
  void drawLine(double x1, double y1, double x2, double y2) {
    body_ += "<line x1=\"" + number(x1) + "\" y1=\"" + number(y1) + "\" x2=\"" + number(x2) + "\" y2=\"" + number(y2) +
             "\" stroke=\"#888888\" stroke-width=\"0.75\"/>\n";
  }

  void drawHeading(const std::string& title) {
    drawText(kMargin, y_ += 20, elide(title, 90), " font-size=\"17\" font-weight=\"bold\"");
    drawText(kMargin, y_ += 21, describeUse(map_) + "; " + describeHoles(map_), " font-size=\"12\"");
    const std::string longest = describeLongest(map_);
    if (!longest.empty()) drawText(kMargin, y_ += 17, longest, " font-size=\"12\"");
    y_ += 16;
  }

  // Where the waveforms fill little of the memory, a second bar shows their part of it.
  void drawBars() {
    const std::uint64_t all = map_.memoryBytes();
    drawBar(all);
    const std::uint64_t end = endOfWaveforms();
    if (end == 0 || end > all / 2) return;
    const double top = y_ - kRowHeight + 5;  // below the numbers
    y_ += kZoomGap - kRowHeight;
    drawLine(kMargin, top, kMargin, y_);
    drawLine(kMargin + kBarWidth * static_cast<double>(end) / static_cast<double>(all), top, kMargin + kBarWidth, y_);
    drawBar(end);
  }

  std::uint64_t endOfWaveforms() const {
    std::uint64_t end = 0;
    for (const MappedBlock& block : map_.blocks()) {
      if (!block.isHole()) end = block.firstByte + block.bytes;
    }
    return end;
  }

  // The memory from byte 0 to `bytes`.
  void drawBar(std::uint64_t bytes) {
    const double scale = kBarWidth / static_cast<double>(bytes);
    std::size_t waveforms = 0;
    for (const MappedBlock& block : map_.blocks()) {
      if (block.firstByte >= bytes) break;
      const std::string_view fill = block.isHole() ? kHoleFill : fillOf(waveforms++);
      drawBlock(block, kMargin + scale * static_cast<double>(block.firstByte), scale * static_cast<double>(block.bytes),
                fill);
    }
    y_ += kBarHeight + 13;
    drawText(kMargin, y_, "0");
    drawText(kMargin + kBarWidth, y_, formatCount(bytes) + " bytes", " text-anchor=\"end\"");
    y_ += kRowHeight;
  }

  void drawBlock(const MappedBlock& block, double x, double width, std::string_view fill) {
    drawBox(x, y_, width, kBarHeight, fill);
    const std::string name =
        elide(block.isHole() ? "free" : block.waveform, static_cast<int>(width / kCharacterWidth) - 1);
    if (block.isHole() && name != "free") return;
    drawText(x + width / 2, y_ + kBarHeight / 2 + 4, name,
             block.isHole() ? " text-anchor=\"middle\" stroke=\"#ffffff\" stroke-width=\"4\" paint-order=\"stroke\""
                            : " text-anchor=\"middle\"");
  }

  static std::string_view fillOf(std::size_t waveform) { return kFills[waveform % std::size(kFills)]; }

  void drawTable() {
    const std::size_t rows = map_.blocks().size();
    const std::size_t perColumn = rows <= kMostRowsInOneColumn ? rows : (rows + 1) / 2;
    const double top = y_ + 10;
    std::size_t waveforms = 0;
    for (std::size_t row = 0; row < rows; ++row) {
      const double left = kMargin + (row < perColumn ? 0 : kBarWidth - kTableWidth);
      if (row == 0 || row == perColumn) drawTableHead(left, y_ = top);
      const MappedBlock& block = map_.blocks()[row];
      drawRow(block, left, y_ += kRowHeight, block.isHole() ? kHoleFill : fillOf(waveforms++));
    }
    y_ = top + kRowHeight * static_cast<double>(perColumn);
  }

  void drawTableHead(double left, double y) {
    drawText(left + kNameLeft, y, "waveform", " font-weight=\"bold\"");
    drawText(left + kFirstByteRight, y, "first byte", " font-weight=\"bold\" text-anchor=\"end\"");
    drawText(left + kBytesRight, y, "bytes", " font-weight=\"bold\" text-anchor=\"end\"");
    drawText(left + kSamplesRight, y, "samples", " font-weight=\"bold\" text-anchor=\"end\"");
    drawText(left + kTableWidth, y, "lasts", " font-weight=\"bold\" text-anchor=\"end\"");
    drawLine(left, y + 4.5, left + kTableWidth, y + 4.5);
  }

  void drawRow(const MappedBlock& block, double left, double y, std::string_view fill) {
    constexpr std::string_view kRight = " text-anchor=\"end\"";
    drawBox(left, y - 9, 10, 10, fill);
    drawText(left + kNameLeft, y, block.isHole() ? "free" : elide(block.waveform, kNameColumns),
             block.isHole() ? " font-style=\"italic\"" : "");
    drawText(left + kFirstByteRight, y, formatCount(block.firstByte), kRight);
    drawText(left + kBytesRight, y, formatCount(block.bytes), kRight);
    drawText(left + kSamplesRight, y, formatCount(block.samples), kRight);
    drawText(left + kTableWidth, y, formatQuantity(static_cast<double>(block.samples) / sampleRateHz_, "s"), kRight);
  }

  const MemoryMap& map_;
  double sampleRateHz_;
  double y_ = kMargin;  // of what comes next
  std::string body_;
};

}  // namespace

std::string drawMemoryMap(const Fit& fit, const std::string& title) {
  const MemoryMap map = fit.memoryMap();
  return Picture(fit, map).draw(title);
}

}  // namespace tools
