#include "kterr/Elaboration.h"

#include <charconv>
#include <cmath>
#include <string_view>

#include "kterr/JsonReader.h"

namespace kterr {
namespace {

// Room for "{}", its NUL and the sentinel.
constexpr std::uint32_t kSmallestBuffer = 4;

JsonCursor stopped(tStatus& status) { return {nullptr, growParsed, &status}; }

// From behind a container that was just put to its closing character, so that the next item goes inside.
JsonCursor enter(JsonCursor behind) {
  if (behind.position != nullptr) --behind.position;
  return behind;
}

JsonCursor leave(JsonCursor inside) {
  if (inside.position != nullptr) ++inside.position;
  return inside;
}

// An integer in decimal.
struct Digits {
  template <typename Integer>
  explicit Digits(Integer value) {
    std::to_chars(text, text + sizeof text - 1, value);
  }
  char text[24] = {};
};

// The whole place at once, where there is room for it; null where that is too little.
char* addPlace(char* position, const char* file, const Digits& line) {
  char escaped[256];
  if (position == nullptr || escapedLength(file) > sizeof escaped) return nullptr;
  const std::string_view path(escaped, escape(escaped, file));
  return addRaw(position, {R"("file":")", path, R"(","line":)", line.text, R"(,"component":")", kComponent, "\""});
}

JsonCursor addTranslatorInfo(JsonCursor end, const char* translator) {
  return enter(putObject(put(end, "translator", translator), "translator_info"));
}

// Fills an info object that has no "ordered_data".
JsonCursor fillTranslatorInfo(JsonCursor info) {
  return enter(putArray(put(put(info, "is_debug", "0"), "version", std::int32_t{1}), "ordered_data"));
}

// The cursor inside the "translator_info" object of `translator`, created where it is missing.
JsonCursor openTranslatorInfo(tStatus& status, const char* translator) {
  JsonCursor end = openElaboration(status);
  if (end.position == nullptr) return end;
  char* name = findKey(status.json, "translator");
  if (name == nullptr) return addTranslatorInfo(end, translator);
  if (*name != '"' || !jsonStringEquals(name, translator)) return stopped(status);
  char* info = findKey(status.json, "translator_info");
  if (info == nullptr) return enter(putObject(end, "translator_info"));
  return *info == '{' ? JsonCursor{info, growParsed, &status} : stopped(status);
}

JsonCursor openEntry(JsonCursor cursor, const char* type) {
  return put(enter(putObject(cursor, nullptr)), "type", type);
}

struct UsageValue {
  const char* text;
  const char* type;
  bool isQuoted = true;
};

// Inserts a whole entry whose texts need no escapes, growing the buffer for it. Where growth fails this returns null,
// and `cursor` can grow no more.
char* addPlainEntry(JsonCursor& cursor, const char* tag, const UsageValue& value) {
  const char* quote = value.isQuoted ? "\"" : "";
  for (;;) {
    if (char* behind = addRaw(cursor.position, {R"({"type":"usage","usage":")", tag, R"(","value":)", quote, value.text,
                                                quote, R"(,"value_type":")", value.type, R"("})"})) {
      return behind;
    }
    char* grown = cursor.grow != nullptr ? cursor.grow(cursor.position, *cursor.status) : nullptr;
    if (grown == nullptr) break;
    cursor.position = grown;
  }
  cursor.grow = nullptr;
  return nullptr;
}

JsonCursor addEntry(JsonCursor cursor, const char* tag, const UsageValue& value) {
  if (cursor.position != nullptr && arePlainJson(tag) && arePlainJson(value.text)) {
    if (char* behind = addPlainEntry(cursor, tag, value)) return {behind, cursor.grow, cursor.status};
  }
  // Member by member: of an entry that does not fit, those that do are written.
  cursor = put(openEntry(cursor, "usage"), "usage", tag);
  cursor = value.isQuoted ? put(cursor, "value", value.text) : putLiteral(cursor, "value", value.text);
  return leave(put(cursor, "value_type", value.type));
}

}  // namespace

JsonCursor openElaboration(tStatus& status) {
  if (!ensureCapacity(status, kSmallestBuffer)) return stopped(status);
  char* end = *status.json == '{' ? findEnd(status.json) : nullptr;
  return {end, growParsed, &status};
}

JsonCursor putPlace(JsonCursor cursor, const char* file, std::uint32_t line) {
  if (char* behind = addPlace(cursor.position, file, Digits(line))) return {behind, cursor.grow, cursor.status};
  return put(put(put(cursor, "file", file), "line", line), "component", kComponent);
}

JsonCursor getOrderedData(tStatus& status, const char* translator) {
  JsonCursor info = openTranslatorInfo(status, translator);
  if (info.position == nullptr) return info;
  char* object = *info.position == '{' ? info.position : info.position - 1;
  if (char* data = findKey(object, "ordered_data")) {
    return *data == '[' ? JsonCursor{findEnd(data), growParsed, &status} : stopped(status);
  }
  return fillTranslatorInfo(info);
}

JsonCursor addOrderedData(JsonCursor end, const char* translator) {
  constexpr std::string_view kClosing = "]}";
  if (end.position == nullptr) return end;
  if (char* behind = addRaw(end.position, {R"("translator":")", translator,
                                           R"(","translator_info":{"is_debug":"0","version":1,"ordered_data":[]})"})) {
    return {behind - kClosing.size(), end.grow, end.status};
  }
  return fillTranslatorInfo(addTranslatorInfo(end, translator));
}

JsonCursor addUsage(JsonCursor cursor, const char* tag, std::int32_t value) {
  return addEntry(cursor, tag, {Digits(value).text, "int32_t", false});
}

JsonCursor addUsage(JsonCursor cursor, const char* tag, std::uint32_t value) {
  return addEntry(cursor, tag, {Digits(value).text, "uint32_t", false});
}

JsonCursor addUsage(JsonCursor cursor, const char* tag, std::int64_t value) {
  return addEntry(cursor, tag, {Digits(value).text, "int64_t"});
}

JsonCursor addUsage(JsonCursor cursor, const char* tag, std::uint64_t value) {
  return addEntry(cursor, tag, {Digits(value).text, "uint64_t"});
}

JsonCursor addUsage(JsonCursor cursor, const char* tag, float value) {
  if (std::isnan(value)) return addEntry(cursor, tag, {"NaN", "float"});
  if (std::isinf(value)) return addEntry(cursor, tag, {value > 0 ? "Infinity" : "-Infinity", "float"});
  return addEntry(cursor, tag, {formatEngineering(value).c_str(), "float"});
}

JsonCursor addUsage(JsonCursor cursor, const char* tag, const char* value) {
  return addEntry(cursor, tag, {value, "string"});
}

JsonCursor addComment(JsonCursor cursor, const char* text) {
  return leave(put(openEntry(cursor, "comment"), "comment", text));
}

std::string formatEngineering(double x) {
  double mantissa = std::fabs(x);
  int exponent = 0;
  if (mantissa != 0) {
    for (; mantissa <= 1 && mantissa != 0; exponent -= 3) mantissa *= 1000;
    for (; mantissa >= 1000; exponent += 3) mantissa /= 1000;
  }
  const int decimals = mantissa == std::floor(mantissa) ? 1 : 6;
  char text[100];
  char* end = text;
  if (x < 0) *end++ = '-';
  end = std::to_chars(end, text + sizeof text, mantissa, std::chars_format::fixed, decimals).ptr;
  if (exponent != 0) {
    *end++ = 'e';
    end = std::to_chars(end, text + sizeof text, exponent).ptr;
  }
  return {text, end};
}

}  // namespace kterr
