#!/bin/sh
# checkHeaders.sh include: compiles each public header alone, in every mode of both languages, by the strictest reading,
# with each of gcc and clang that there is.
set -eu
include=$1 compiled=0 failed=0
modes='c:c89 c:c99 c:c11 c:c17 c:c2x c++:c++98 c++:c++03 c++:c++11 c++:c++14 c++:c++17 c++:c++20 c++:c++2b'

# A program of one header, which also makes a table of the codes where they are listed.
program() {
  cat <<EOP
#include "ktorba/$1"
#ifdef KTORBA_ERROR_CODES
#define ROW(name, code, meaning, help) {name, code, #name, meaning, help},
struct row { int value, code; const char *name, *meaning, *help; } table[] = {KTORBA_ERROR_CODES(ROW) {0, 0, "", "", ""}};
#endif
EOP
}

for compiler in gcc clang; do
  command -v $compiler >/dev/null || continue
  for header in "$include"/ktorba/*.h; do
    for mode in $modes; do
      compiled=$((compiled + 1))
      program "${header##*/}" |
        $compiler -x "${mode%:*}" -std="${mode#*:}" -fsyntax-only -Wall -Wextra -pedantic -Werror -I"$include" - && continue
      echo "$header: $compiler -std=${mode#*:} refuses it"
      failed=$((failed + 1))
    done
  done
done
echo "$compiled compiled, $failed refused"
[ $compiled -gt 0 ] && [ $failed = 0 ]
