#include "cli/JsonWriter.h"

#include <utility>

#include "cli/console.h"
#include "tools/diagnostics/json.h"
#include "tools/text/quantities.h"

namespace tools::cli {
namespace {

constexpr int kSchema = 1;

std::string lineBreak(std::size_t depth) { return "\n" + std::string(2 * depth, ' '); }

}  // namespace

JsonWriter::JsonWriter(std::string_view command) {
  print("{");
  levels_.push_back({'}', true});
  add("schema", kSchema);
  add("command", command);
}

void JsonWriter::finish() {
  close();
  print("\n");
}

void JsonWriter::add(std::string_view key, std::string_view text) { addBare(key, quoteAsJson(text)); }

void JsonWriter::add(std::string_view key, double number) { addBare(key, formatNumber(number)); }

void JsonWriter::add(std::string_view key, bool value) { addBare(key, value ? "true" : "false"); }

void JsonWriter::addBare(std::string_view key, const std::string& text) {
  separate(key);
  print(text);
}

void JsonWriter::addUsage(std::string_view key, std::uint64_t used, std::uint64_t available) {
  openObject(key);
  add("used", used);
  add("available", available);
  close();
}

void JsonWriter::open(std::string_view key, char begin, Shape shape) {
  separate(key);
  print(std::string(1, begin));
  levels_.push_back({begin == '{' ? '}' : ']', shape == Shape::kTall});
}

void JsonWriter::close() {
  const Level level = levels_.back();
  levels_.pop_back();
  if (level.isTall && !level.isEmpty) print(lineBreak(levels_.size()));
  print(std::string(1, level.end));
}

void JsonWriter::separate(std::string_view key) {
  Level& level = levels_.back();
  const bool isFirst = std::exchange(level.isEmpty, false);
  if (!isFirst) print(level.isTall ? "," : ", ");
  if (level.isTall) print(lineBreak(levels_.size()));
  if (!key.empty()) print(quoteAsJson(key) + ": ");
}

}  // namespace tools::cli
