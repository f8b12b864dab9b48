#!/usr/bin/env bash
# Builds the two libraries and the simulated generator for Windows, with Debian's cross compiler, and compares what the
# libraries export with the public header. Nothing of it is run.
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/setup.sh build checks
cmake --preset win32 -DKTORBA_WARNINGS_AS_ERRORS=ON
cmake --build --preset win32
for library in ktorba ktorba_elaborating; do
  cmake -DOBJDUMP=x86_64-w64-mingw32-objdump -DLIBRARY=build/win32/source/ktorba_lib/$library.dll \
    -DHEADER=include/ktorba/ktorba.h -P tests/package/checkExports.cmake
done
