#include "ktifw_lib_client/FrameworkStatus.h"

#include <charconv>

#include "kterr/ErrorConstant.h"
#include "kterr/JsonReader.h"

namespace ktifw_lib_client {
namespace {

// The source that memory failures are reported from.
constexpr char kMemorySource[] = R"(ktifw_lib_client\memory)";

// The end of the string under `key`, as much as fits; empty when there is none.
template <std::size_t kCapacity>
void readText(char* json, const char* key, char (&text)[kCapacity]) {
  text[0] = '\0';
  char* const value = kterr::findKey(json, key);
  if (value == nullptr || *value != '"' || kterr::parseValue(value) == nullptr) return;
  kterr::copyJsonStringTail(value, text, kCapacity);
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
  char component[sizeof status.component];
  char file[sizeof status.file];
  readText(json, "component", component);
  readText(json, "file", file);
  kterr::mergeCode(status, code, component, file, readLine(json));
}

}  // namespace

void FrameworkStatus::mergeInto(Status& status) const {
  if (status_.code == 0 || failed(status)) return;
  if (status_.json == nullptr) {
    kterr::setCode(status, status_.code);
  } else {
    mergeElaborated(status, status_.code, status_.json);
  }
}

void setOutOfMemory(Status& status, std::uint32_t line) {
  kterr::mergeCode(status, ktorba_codes::kNoMemory.code, kterr::kComponent, kMemorySource, line);
}

}  // namespace ktifw_lib_client
