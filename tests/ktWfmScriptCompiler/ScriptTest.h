// What the tests of the script compiler share.
#pragma once

#include <nlohmann/json.hpp>
#include <regex>
#include <string>

#include "ktWfmScriptCompiler/compile.h"
#include "kterr/Exception.h"

namespace ktwfmscriptcompiler {

// A session's vocabulary; lengths are multiples of 8 and waits at least 64 samples.
inline ScriptTraits testTraits() {
  ScriptTraits traits = standardScriptTraits();
  traits.alignmentQuantum = 8;
  traits.minWaitLength = 64;
  return traits;
}

// An elaboration on one line, without the place of the raise site: constant, code, place in the script, other values.
inline std::string describe(const kterr::Exception& failure) {
  const auto elaboration = nlohmann::ordered_json::parse(failure.what());
  std::string text =
      "error " + elaboration.at("error_constant").get<std::string>() + " " + std::to_string(failure.code());
  if (!elaboration.contains("translator_info")) return text;
  for (const auto& entry : elaboration.at("translator_info").at("ordered_data")) {
    text += ", " + entry.at("usage").get<std::string>() + " " + entry.at("value").dump() + " " +
            entry.at("value_type").get<std::string>();
  }
  static const std::regex place(", kUsageTypeLineNumber (\\d+) uint32_t, kUsageTypePositionInLine (\\d+) uint32_t");
  return std::regex_replace(text, place, " at $1:$2");
}

// The error of compiling `text`, as describe() gives it; empty when there is none.
inline std::string errorOf(const std::string& text, const ScriptTraits& traits = testTraits()) {
  try {
    compile(text, traits);
  } catch (const kterr::Exception& failure) {
    return describe(failure);
  }
  return "";
}

}  // namespace ktwfmscriptcompiler
