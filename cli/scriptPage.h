// The page of the manual on the script language, made from its document.
#pragma once

#include <string>

namespace tools::cli {

// `document`: Markdown with headings, paragraphs, lists, tables of two columns, fenced and indented code, of which the
// fences of faulty scripts name the error.
std::string makeScriptPage(const std::string& document, const std::string& version);

}  // namespace tools::cli
