#include "tools/sources/NpyHeader.h"

#include <array>
#include <limits>

#include "tools/text/Refusal.h"
#include "tools/text/quantities.h"
#include "tools/text/words.h"

namespace tools {
namespace {

constexpr std::string_view kMagic = "\x93NUMPY";
constexpr std::size_t kLongestText = 1 << 16;
constexpr char kTypesHelp[] = "Save it as int16, int32, float32 or float64.";

struct TypeRow {
  std::string_view kind;
  const char* name;
};
constexpr TypeRow kOtherTypes[] = {{"b", "truth values"}, {"c", "complex numbers"}, {"O", "Python objects"},
                                   {"S", "texts"},        {"U", "texts"},           {"V", "records"},
                                   {"M", "dates"},        {"m", "durations"}};

// Reads the text of a header: a dictionary with exactly the keys descr, fortran_order and shape.
class HeaderText {
 public:
  HeaderText(const std::string& source, std::string_view text) : source_(source), rest_(text) {}

  NpyHeader parse() {
    expect('{');
    while (!take('}')) {
      parseEntry();
      if (take('}')) break;
      expect(',');
    }
    skipBlanks();
    if (!rest_.empty() || seen_ != 7) refuse();
    return header_;
  }

 private:
  [[noreturn]] void refuse() const {
    throw Refusal(source_ + ": the header is damaged", "It must tell descr, fortran_order and shape, each once.");
  }

  void skipBlanks() { rest_.remove_prefix(std::min(rest_.find_first_not_of(" \n"), rest_.size())); }

  bool take(std::string_view word) {
    skipBlanks();
    if (!rest_.starts_with(word)) return false;
    rest_.remove_prefix(word.size());
    return true;
  }
  bool take(char c) { return take(std::string_view(&c, 1)); }
  void expect(char c) {
    if (!take(c)) refuse();
  }

  std::string takeText() {
    skipBlanks();
    const char quote = rest_.empty() ? '\0' : rest_.front();
    if (quote != '\'' && quote != '"') refuse();
    const std::size_t end = rest_.find(quote, 1);
    if (end == std::string_view::npos) refuse();
    std::string text(rest_.substr(1, end - 1));
    rest_.remove_prefix(end + 1);
    return text;
  }

  void parseEntry() {
    const std::string key = takeText();
    expect(':');
    if (key == "descr") return note(1), parseType();
    if (key == "fortran_order") return note(2), parseOrder();
    if (key == "shape") return note(4), parseShape();
    refuse();
  }

  void note(unsigned key) {
    if ((seen_ & key) != 0) refuse();
    seen_ |= key;
  }

  void parseType() {
    skipBlanks();
    if (rest_.starts_with('[')) refuseType("records");
    const std::string type = takeText();
    if (type.size() < 2) refuse();
    for (const TypeRow& row : kOtherTypes) {
      if (type.substr(1).starts_with(row.kind)) refuseType(row.name);
    }
    header_.kind = type[1];
    header_.isBigEndian = type[0] == '>';
    header_.bytes = parseInteger<unsigned>(type.substr(2)).value_or(0);
    const bool isWhole = header_.kind == 'i' || header_.kind == 'u';
    const bool isTaken = isWhole ? header_.bytes == 2 || header_.bytes == 4
                                 : header_.kind == 'f' && (header_.bytes == 4 || header_.bytes == 8);
    if (!isTaken) refuseType("elements of the type \"" + type + "\"");
    if (type[0] != '<' && type[0] != '>') refuse();
  }

  [[noreturn]] void refuseType(const std::string& what) const {
    throw Refusal(source_ + ": holds " + what + ", which are no samples", kTypesHelp);
  }

  void parseOrder() {
    header_.isFortranOrder = take("True");
    if (!header_.isFortranOrder && !take("False")) refuse();
  }

  void parseShape() {
    expect('(');
    while (!take(')')) {
      header_.shape.push_back(takeInteger());
      if (take(')')) break;
      expect(',');
    }
  }

  std::uint64_t takeInteger() {
    skipBlanks();
    const std::size_t end = std::min(rest_.find_first_not_of("0123456789"), rest_.size());
    const auto value = parseInteger<std::uint64_t>(rest_.substr(0, end));
    if (!value) refuse();
    rest_.remove_prefix(end);
    return *value;
  }

  const std::string& source_;
  std::string_view rest_;
  unsigned seen_ = 0;
  NpyHeader header_;
};

// All bytes of the elements; the greatest number where that is beyond it.
std::uint64_t countBytes(const NpyHeader& header) {
  constexpr auto kMost = std::numeric_limits<std::uint64_t>::max();
  std::uint64_t count = header.bytes;
  for (const std::uint64_t extent : header.shape) {
    if (extent != 0 && count > kMost / extent) return kMost;
    count *= extent;
  }
  return count;
}

void checkLength(const std::string& source, const NpyHeader& header, std::uint64_t fileBytes) {
  const std::uint64_t wanted = countBytes(header);
  const std::uint64_t there = fileBytes - header.headerBytes;
  if (wanted == there) return;
  throw Refusal(source + ": is " + (wanted > there ? "shorter" : "longer") + " than its header says: " +
                    formatCount(there) + " bytes of elements for " + header.shapeText() + " of " + header.typeName(),
                "The file was cut off or damaged; save it anew.");
}

unsigned readLittleEndian(const std::string& bytes) {
  unsigned value = 0;
  for (std::size_t i = bytes.size(); i-- > 0;) value = value << 8 | static_cast<unsigned char>(bytes[i]);
  return value;
}

class HeaderReader {
 public:
  HeaderReader(const std::string& source, ByteStream& stream) : source_(source), stream_(stream) {}

  NpyHeader read() {
    if (take(kMagic.size()) != kMagic) throw Refusal(source_ + ": is no array file", "Arrays begin with \\x93NUMPY.");
    const auto version = static_cast<unsigned>(static_cast<unsigned char>(take(2)[0]));
    if (version < 1 || version > 3) throw Refusal(source_ + ": has a header of version " + std::to_string(version));
    const unsigned length = readLittleEndian(take(version == 1 ? 2 : 4));
    if (length > kLongestText) throw Refusal(source_ + ": the header is damaged", "It says to be too long.");
    NpyHeader header = HeaderText(source_, take(length)).parse();
    header.headerBytes = taken_;
    checkLength(source_, header, stream_.size());
    return header;
  }

 private:
  const std::string& take(std::size_t count) {
    bytes_.resize(count);
    if (stream_.read(bytes_.data(), count) != count) throw Refusal(source_ + ": ends within the header");
    taken_ += count;
    return bytes_;
  }

  const std::string& source_;
  ByteStream& stream_;
  std::string bytes_;
  std::uint64_t taken_ = 0;
};

}  // namespace

std::string NpyHeader::typeName() const {
  return (kind == 'i' ? "int" : kind == 'u' ? "uint" : "float") + std::to_string(8 * bytes);
}

std::string NpyHeader::shapeText() const {
  if (shape.empty()) return "a single value";
  std::vector<std::string> extents;
  for (const std::uint64_t extent : shape) extents.push_back(formatCount(extent));
  return join(extents, " \u00d7 ");
}

NpyHeader readNpyHeader(const std::string& source, ByteStream& stream) { return HeaderReader(source, stream).read(); }

}  // namespace tools
