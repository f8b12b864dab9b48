// Elaborations: texts through the reader, beside another JSON reader, and failures through the writer, in a record
// whose buffer grows only so far and may hold any text before.
#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "kterr/Failure.h"
#include "kterr/JsonReader.h"
#include "kterr/Status.h"
#include "testing/require.h"

namespace {

using nlohmann::json;

bool isAscii(const std::string& text) {
  return std::ranges::all_of(text, [](char c) { return c >= 0 && c != 0x7F; });
}

// What the other reader takes, this one takes as well, to the same end and with the same members. (It takes more:
// texts that are no UTF-8, for one.)
void checkReader(const std::string& source, const std::string& key) {
  std::vector<char> bytes(source.c_str(), source.c_str() + std::string(source.c_str()).size() + 1);
  char* text = kterr::skipJsonBlanks(bytes.data());
  char* end = kterr::parseValue(text);
  char* member = kterr::findKey(text, key.c_str());
  require(end == nullptr || (end > text && end < bytes.data() + bytes.size()), "end of a value");
  require((kterr::findEnd(text) != nullptr) == (end != nullptr && (*text == '{' || *text == '[')),
          "end of a container");
  if (!isAscii(source) || source.size() > 1000) return;  // 1000 open containers are within what it reads
  const json other = json::parse(text, nullptr, false);
  if (other.is_discarded()) return;
  require(end != nullptr && *kterr::skipJsonBlanks(end) == '\0', "a value that is JSON");
  require(!other.is_object() || (member != nullptr) == other.contains(key.c_str()), "a member");
}

std::uint32_t mostBytes = 0;

bool reallocUpToMost(tStatus* status, std::uint32_t newCapacity) {
  return newCapacity <= mostBytes && kterr::defaultReallocJson(status, newCapacity);
}

// Text, NUL, zeros, sentinel.
void checkBuffer(const tStatus& status) {
  const char* const last = status.json + status.capacity - 1;
  const char* const end = std::find(static_cast<const char*>(status.json), last, '\0');
  require(end != last && *last == kterr::kSentinel, "terminator and sentinel");
  require(std::all_of(end, last, [](char c) { return c == '\0'; }), "zeros behind the text");
}

json makeUsage(const std::string& tag, const json& value, const char* type) {
  return {{"type", "usage"}, {"usage", tag}, {"value", value}, {"value_type", type}};
}

// Writes one piece and adds what it has to read as to `entries`.
void writePiece(FuzzedDataProvider& input, kterr::ElaborationWriter& writer, json& entries, bool& ascii) {
  const std::string tag = input.ConsumeRandomLengthString(64).c_str();
  const std::string text = input.ConsumeRandomLengthString(600).c_str();
  ascii = ascii && isAscii(tag) && isAscii(text);
  const auto number = input.ConsumeIntegral<std::int64_t>();
  switch (input.ConsumeIntegralInRange(0, 6)) {
    case 0:
      return writer.place(text.c_str(), static_cast<std::uint32_t>(number));
    case 1:
      return writer.message(tag.c_str(), text.c_str());
    case 2:
      entries.push_back({{"type", "comment"}, {"comment", text}});
      return writer.comment(text.c_str());
    case 3:
      entries.push_back(makeUsage(tag, text, "string"));
      return writer.usage(tag.c_str(), text.c_str());
    case 4:
      entries.push_back(makeUsage(tag, std::to_string(number), "int64_t"));
      return writer.usage(tag.c_str(), number);
    case 5:
      entries.push_back(makeUsage(tag, static_cast<std::int32_t>(number), "int32_t"));
      return writer.usage(tag.c_str(), static_cast<std::int32_t>(number));
    default:
      entries.push_back(makeUsage(tag, kterr::formatEngineering(static_cast<float>(number)), "float"));
      return writer.usage(tag.c_str(), static_cast<float>(number));
  }
}

void checkWriter(FuzzedDataProvider& input, const std::string& textBefore) {
  mostBytes = input.ConsumeIntegralInRange<std::uint32_t>(0, 1 << 14);
  tStatus status = kterr::makeStatus();
  status.reallocJson = reallocUpToMost;
  const bool hadText = input.ConsumeBool() && kterr::setJson(status, textBefore.c_str());
  const bool hadSoundText = hadText && *status.json == '{' && kterr::findEnd(status.json) != nullptr;
  json entries = json::array();
  bool ascii = true;
  {
    kterr::ElaborationWriter writer(status, "ktorba_errors::kErrorSequenceSizeTooLarge");
    while (input.remaining_bytes() != 0) {
      writePiece(input, writer, entries, ascii);
      if (status.json == nullptr) continue;
      checkBuffer(status);
      if (!hadText || hadSoundText) require(kterr::findEnd(status.json) != nullptr, "text of an elaboration");
    }
  }
  const bool isWhole = !hadText && status.json != nullptr && 4 * status.capacity < mostBytes;
  if (isWhole && ascii && !entries.empty()) {
    require(json::parse(status.json).at("translator_info").at("ordered_data") == entries, "values as written");
  }
  kterr::freeJson(status);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
  FuzzedDataProvider input(data, size);
  const std::string text = input.ConsumeRandomLengthString();
  checkReader(text, input.ConsumeRandomLengthString(32));
  checkWriter(input, text);
  return 0;
}
