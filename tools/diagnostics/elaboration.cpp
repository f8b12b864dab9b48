#include "tools/diagnostics/elaboration.h"

#include <algorithm>
#include <vector>

#include "kterr/usageTags.h"
#include "tools/diagnostics/json.h"
#include "tools/text/nearMiss.h"
#include "tools/text/words.h"

namespace tools {
namespace {

using Value = ElaborationRecord::Value;

// How the value of a tag is told: the words before and behind it. Tags that are not here are told by their own text.
struct ValueWords {
  std::string_view tag;
  const char* before;
  const char* behind;
};
constexpr ValueWords kValueWords[] = {
    {kterr::kUsageTypeAlignmentQuantum, "the quantum is ", ""},
    {kterr::kUsageTypeAllocWaveformLength, "the waveform has ", " samples"},
    {kterr::kUsageTypeInvalidIdentifier, "found \"", "\""},
    {kterr::kUsageTypeInvalidString, "found \"", "\""},
    {kterr::kUsageTypeLargestAvailMemoryBlock, "the largest free block has ", " bytes"},
    {kterr::kUsageTypeMarkerPosition, "position ", ""},
    {kterr::kUsageTypeMaxLength, "at most ", ""},
    {kterr::kUsageTypeMinMarkerDistFromOtherMarker, "at least ", " samples apart"},
    {kterr::kUsageTypeMinSubsetLength, "at least ", " samples"},
    {kterr::kUsageTypeMinWaveformLength, "at least ", " samples"},
    {kterr::kUsageTypeNumSampsToWrite, "", " samples"},
    {kterr::kUsageTypeNumberOfSamplesToWait, "", " samples"},
    {kterr::kUsageTypeParameterName, "", ""},
    {kterr::kUsageTypePositionOfInvalidCharacter, "at byte ", ""},
    {kterr::kUsageTypePossibleKeywords, "expected ", ""},
    {kterr::kUsageTypeScriptName, "script \"", "\""},
    {kterr::kUsageTypeStartOffset, "start ", ""},
    {kterr::kUsageTypeSubsetLength, "length ", ""},
    {kterr::kUsageTypeSubsetStartOffset, "start ", ""},
    {kterr::kUsageTypeValMustBeGreaterThanOrEqualTo, "at least ", ""},
    {kterr::kUsageTypeWaveformLength, "", " samples"},
    {kterr::kUsageTypeWaveformName, "waveform \"", "\""},
};

// The help tells the range already, and line and position stand in front of the message.
constexpr std::string_view kUntold[] = {kterr::kUsageTypeLineNumber, kterr::kUsageTypePositionInLine,
                                        kterr::kUsageTypeMinValue, kterr::kUsageTypeMaxValue};
template <typename Range, typename Item>
bool contains(const Range& range, const Item& item) {
  return std::find(std::begin(range), std::end(range), item) != std::end(range);
}

// A text of the script, or the code of a character that scripts do not use.
std::string tellBadValue(const Value& value) {
  if (!value.number) return value.text.empty() ? "found the end of the script" : "found \"" + value.text + "\"";
  const auto code = static_cast<int>(*value.number & 0xFF);
  const std::string number = std::to_string(code);
  if (code < 0x21 || code > 0x7E) return "found the byte " + number;
  return std::string("found '") + static_cast<char>(code) + "'";
}

std::string tell(const Value& value) {
  if (value.tag == kterr::kUsageTypeBadValue) return tellBadValue(value);
  for (const ValueWords& words : kValueWords) {
    if (words.tag == value.tag) return words.before + value.text + words.behind;
  }
  return value.tag + " " + value.text;
}

std::string tellAll(const ElaborationRecord& elaboration) {
  std::vector<std::string> told = elaboration.messages;
  for (const Value& value : elaboration.values) {
    if (!contains(kUntold, value.tag)) told.push_back(tell(value));
  }
  return told.empty() ? "" : ": " + join(told);
}

std::string find(const std::vector<Value>& values, std::string_view tag) {
  const auto found = std::find_if(values.begin(), values.end(), [tag](const Value& value) { return value.tag == tag; });
  return found == values.end() ? std::string() : found->text;
}

std::uint32_t findNumber(const std::vector<Value>& values, std::string_view tag) {
  for (const Value& value : values) {
    if (value.tag == tag && value.number && *value.number >= 0) return static_cast<std::uint32_t>(*value.number);
  }
  return 0;
}

std::vector<std::string> splitKeywords(const std::string& list) {
  std::vector<std::string> keywords;
  for (std::size_t first = 0; first < list.size();) {
    const std::size_t comma = std::min(list.find(", ", first), list.size());
    keywords.push_back(list.substr(first, comma - first));
    first = comma + 2;
  }
  return keywords;
}

std::string replaceAll(std::string text, std::string_view from, std::string_view to) {
  for (std::size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size())) {
    text.replace(at, from.size(), to);
  }
  return text;
}

std::string suggestKeyword(const std::vector<Value>& values) {
  const std::string hint = tellSimilar("word", find(values, kterr::kUsageTypeBadValue),
                                       splitKeywords(find(values, kterr::kUsageTypePossibleKeywords)));
  return hint.empty() ? "" : hint + " ";
}

std::string withoutFullStop(std::string sentence) {
  if (sentence.ends_with('.')) sentence.pop_back();
  return sentence;
}

// Some codes have no text, or one that says nothing.
std::string nameOf(const kterr::ErrorConstant& constant) {
  const bool hasName =
      constant.text != nullptr && std::string_view(constant.text).size() > std::string_view("err").size();
  return hasName ? constant.text : constant.cName;
}

}  // namespace

const kterr::ErrorConstant* findErrorConstant(const std::string& text) {
  for (const kterr::ErrorConstant& constant : kterr::allErrorConstants()) {
    if (constant.text != nullptr && constant.text == text) return &constant;
  }
  return nullptr;
}

const kterr::ErrorConstant* findErrorConstant(std::int32_t code) {
  for (const kterr::ErrorConstant& constant : kterr::allErrorConstants()) {
    if (constant.code == code) return &constant;
  }
  return nullptr;
}

// What an elaboration holds, the tools tell with the error.
std::string helpOf(const kterr::ErrorConstant& constant) {
  std::string help = replaceAll(constant.help, "message in the elaboration", "error's text");
  help = replaceAll(std::move(help), "elaboration's message", "error's text");
  return replaceAll(std::move(help), "elaboration", "error's text");
}

Diagnostic diagnoseFailure(std::int32_t code, const char* elaborationText) {
  const ElaborationRecord elaboration = readElaboration(elaborationText);
  const kterr::ErrorConstant* constant = findErrorConstant(elaboration.constant);
  if (constant == nullptr) constant = findErrorConstant(code);
  Diagnostic diagnostic;
  diagnostic.code = code;
  diagnostic.place = {findNumber(elaboration.values, kterr::kUsageTypeLineNumber),
                      findNumber(elaboration.values, kterr::kUsageTypePositionInLine)};
  diagnostic.message =
      (constant == nullptr ? "The call failed with code " + std::to_string(code) : withoutFullStop(constant->meaning)) +
      tellAll(elaboration);
  if (constant != nullptr) {
    diagnostic.constant = nameOf(*constant);
    diagnostic.help = suggestKeyword(elaboration.values) + helpOf(*constant);
  }
  return diagnostic;
}

}  // namespace tools
