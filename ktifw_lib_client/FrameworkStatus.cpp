#include "ktifw_lib_client/FrameworkStatus.h"

#include <charconv>
#include <string>

#include "kterr/ErrorConstant.h"
#include "kterr/JsonReader.h"

namespace ktifw_lib_client {
namespace {

// The source that memory failures are reported from.
constexpr char kMemorySource[] = R"(ktifw_lib_client\memory)";

// The end of the string under `key`, as much as a field of `capacity` bytes holds; empty when there is none.
std::string readText(char* json, const char* key, std::size_t capacity) {
  char* const value = kterr::findKey(json, key);
  if (value == nullptr || *value != '"' || kterr::parseValue(value) == nullptr) return {};
  return kterr::readJsonStringTail(value, capacity - 1);
}

// The whole number under "line"; 0 for anything else.
std::uint32_t readLine(char* json) {
  char* const value = kterr::findKey(json, "line");
  const char* const end = value != nullptr ? kterr::parseValue(value) : nullptr;
  if (end == nullptr) return 0;
  std::uint32_t line = 0;
  const auto [last, error] = std::from_chars(value, end, line);
  return error == std::errc() && last == end ? line : 0;
}

void mergeElaborated(Status& status, std::int32_t code, char* json) {
  const std::string component = readText(json, "component", sizeof status.component);
  const std::string file = readText(json, "file", sizeof status.file);
  kterr::mergeCode(status, code, component.c_str(), file.c_str(), readLine(json));
}

}  // namespace

void FrameworkStatus::mergeInto(Status& status) {
  if (status_.code == 0 || failed(status)) return;
  if (!kterr::terminateJson(status_)) {
    kterr::setCode(status, status_.code);
  } else {
    mergeElaborated(status, status_.code, status_.json);
  }
}

void setOutOfMemory(Status& status, std::uint32_t line) {
  kterr::mergeCode(status, ktorba_codes::kNoMemory.code, kterr::kComponent, kMemorySource, line);
}

}  // namespace ktifw_lib_client
