#!/usr/bin/env bash
# Sets up, builds and runs the tests.
#
#   scripts/test.sh [PRESET [CTEST_ARGUMENT...]]     presets: debug (when none is named), release, asan, tsan
set -euo pipefail
cd "$(dirname "$0")/.."

preset=${1:-debug}
shift || true

scripts/setup.sh
cmake --preset "$preset"
cmake --build --preset "$preset"
ctest --preset "$preset" --parallel "$(nproc)" "$@"
