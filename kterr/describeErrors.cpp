// Prints what is told about the error constants elsewhere, from the one table of them.
//
//   ktorba_describe_errors header   include/ktorba/error_codes.h
//   ktorba_describe_errors table    docs/errors.md
#include <iomanip>
#include <iostream>
#include <string>

#include "kterr/ErrorConstant.h"
#include "kterr/hexText.h"

namespace {

constexpr char kHeaderOpening[] =
    R"(/* The codes that the library returns, by name. A code is negative and fits 32 bits; what the exported functions
 * return can be compared with these as it is. The same codes with their constants' texts: docs/errors.md.
 *
 * Written by ktorba_describe_errors from kterr/errors.def.
 */
#ifndef KTORBA_ERROR_CODES_H
#define KTORBA_ERROR_CODES_H

/* clang-format off */
enum ktorba_error_code {
)";

constexpr char kListOpening[] = R"(};

/* The same codes as a list, X(name, code, meaning, help), for programs that print them: the two texts are string
 * literals, those of the comments above. Two names share a code, so a switch cannot have all of them.
 */
#define KTORBA_ERROR_CODES(X))";

constexpr char kHeaderClosing[] = R"(
/* clang-format on */

#endif
)";

constexpr char kTableOpening[] = R"(# Errors

Every exported function returns 0 for success, a negative code for an error and a positive one for a warning. The
elaboration of an error names its constant under `error_constant`; a few errors have a short text or none there, and
are listed by their C names. `<ktorba/error_codes.h>` has a C name for every code: the constant with `_` for `::`, and
`ktorba_` in front of the two platform constants; its `KTORBA_ERROR_CODES(X)` lists all of them with the texts below, for
programs that print them. `kterr/errors.def` is the table behind both: after a change to it, write this page and the
header anew with `ktorba_describe_errors`. What the tool says of a script, which has more kinds of faults than the library
has codes, is in [messages.md](messages.md).

| constant | code | hex | meaning | what to do |
|---|---|---|---|---|
)";

std::string hex(std::int32_t code) { return kterr::hexText(static_cast<std::uint32_t>(code), 8); }

// C89 and C++98 take no comma behind the last one.
void printEnumerators(std::ostream& out) {
  const auto constants = kterr::allErrorConstants();
  for (const kterr::ErrorConstant& constant : constants) {
    const char* const separator = &constant == &constants.back() ? "" : ",";
    out << "  /* " << constant.meaning << "\n   * " << constant.help << " */\n";
    out << "  " << constant.cName << " = " << constant.code << separator << " /* " << hex(constant.code) << " */\n";
  }
}

void printList(std::ostream& out) {
  for (const kterr::ErrorConstant& constant : kterr::allErrorConstants()) {
    out << " \\\n  X(" << constant.cName << ", " << constant.code << ", \\\n    " << std::quoted(constant.meaning)
        << ", \\\n    " << std::quoted(constant.help) << ")";
  }
}

void printHeader(std::ostream& out) {
  out << kHeaderOpening;
  printEnumerators(out);
  out << kListOpening;
  printList(out);
  out << kHeaderClosing;
}

bool isConstant(const kterr::ErrorConstant& constant) {
  return constant.text != nullptr && std::string(constant.text).find("kError") != std::string::npos;
}

std::string name(const kterr::ErrorConstant& constant) {
  if (constant.text == nullptr) return "none (`" + std::string(constant.cName) + "`)";
  const std::string text = "`" + std::string(constant.text) + "`";
  return isConstant(constant) ? text : text + " (`" + constant.cName + "`)";
}

void printTable(std::ostream& out) {
  out << kTableOpening;
  for (const kterr::ErrorConstant& constant : kterr::allErrorConstants()) {
    out << "| " << name(constant) << " | " << constant.code << " | " << hex(constant.code) << " | " << constant.meaning
        << " | " << constant.help << " |\n";
  }
}

}  // namespace

int main(int argc, char** argv) {
  const std::string what = argc > 1 ? argv[1] : "";
  if (what == "header") {
    printHeader(std::cout);
  } else if (what == "table") {
    printTable(std::cout);
  } else {
    std::cerr << "usage: ktorba_describe_errors header|table\n";
    return 2;
  }
  return 0;
}
