#include "tools/diagnostics/JsonWriter.h"

#include <utility>

#include "tools/diagnostics/json.h"
#include "tools/text/quantities.h"

namespace tools {
namespace {

constexpr int kSchema = 1;

std::string lineBreak(std::size_t depth) { return "\n" + std::string(2 * depth, ' '); }

}  // namespace

JsonWriter::JsonWriter(Write write) : write_(std::move(write)) {
  write_("{");
  levels_.push_back({'}', true});
  add("schema", kSchema);
}

void JsonWriter::finish() {
  close();
  write_("\n");
}

void JsonWriter::add(std::string_view key, std::string_view text) { addBare(key, quoteAsJson(text)); }

void JsonWriter::add(std::string_view key, double number) { addBare(key, formatNumber(number)); }

void JsonWriter::add(std::string_view key, bool value) { addBare(key, value ? "true" : "false"); }

void JsonWriter::addBare(std::string_view key, const std::string& text) {
  separate(key);
  write_(text);
}

void JsonWriter::addUsage(std::string_view key, std::uint64_t used, std::uint64_t available) {
  openObject(key);
  add("used", used);
  add("available", available);
  close();
}

void JsonWriter::open(std::string_view key, char begin, Shape shape) {
  separate(key);
  write_(std::string(1, begin));
  levels_.push_back({begin == '{' ? '}' : ']', shape == Shape::kTall});
}

void JsonWriter::close() {
  const Level level = levels_.back();
  levels_.pop_back();
  if (level.isTall && !level.isEmpty) write_(lineBreak(levels_.size()));
  write_(std::string(1, level.end));
}

void JsonWriter::separate(std::string_view key) {
  Level& level = levels_.back();
  const bool isFirst = std::exchange(level.isEmpty, false);
  if (!isFirst) write_(level.isTall ? "," : ", ");
  if (level.isTall) write_(lineBreak(levels_.size()));
  if (!key.empty()) write_(quoteAsJson(key) + ": ");
}

}  // namespace tools
