// What the tests of the script compiler share.
#pragma once

#include <nlohmann/json.hpp>
#include <string>

#include "ktWfmScriptCompiler/compile.h"
#include "kterr/Exception.h"
#include "kterr/usageTags.h"

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
    const std::string tag = entry.at("usage");
    const std::string type = entry.at("value_type");
    const std::string value = entry.at("value").dump();
    if (tag == kterr::kUsageTypeLineNumber && type == "uint32_t") {
      text += " at " + value;
    } else if (tag == kterr::kUsageTypePositionInLine && type == "uint32_t") {
      text += ":" + value;
    } else {
      text += ", " + tag + " " + value + " " + type;
    }
  }
  return text;
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
