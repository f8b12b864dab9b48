#!/usr/bin/env bash
# Measures everything beside its peers, which it installs, and writes docs/performance.md with its plots, whole.
#
#   scripts/bench.sh [ROW]     ROW (see scripts/performance_rows.json): measures that one alone and prints its section
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/setup.sh build benchmarks
cmake --preset release -DKTORBA_BUILD_BENCHMARKS=ON
cmake --build --preset release --target benchmarks
scripts/performance.py build/release docs/performance.md ${1:+--only "$1"}
