#!/usr/bin/env bash
# Sets up, builds and runs the tests.
#
#   scripts/test.sh [PRESET [CTEST_ARGUMENT...]]     presets: debug (when none is named), release, asan, tsan,
#                                                    win32 (built for Windows and run through Wine)
set -euo pipefail
cd "$(dirname "$0")/.."

preset=${1:-debug}
shift || true

groups=(build)
[[ $preset != win32 ]] || groups+=(windows)
scripts/setup.sh "${groups[@]}"
cmake --preset "$preset"
cmake --build --preset "$preset"
ctest --preset "$preset" --parallel "$(nproc)" "$@"
