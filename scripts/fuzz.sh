#!/usr/bin/env bash
# Builds the fuzzers and runs each of them, first over its corpus, then on inputs of its own. What a fuzzer finds new
# stays in build/fuzz/corpus; an input that fails is written to build/fuzz/failures and ends the run.
#
#   scripts/fuzz.sh [SECONDS]     for each fuzzer; 20 when not given
set -euo pipefail
cd "$(dirname "$0")/.."

seconds=${1:-20}
build=build/fuzz

scripts/setup.sh build checks
cmake --preset fuzz
cmake --build --preset fuzz --target fuzzers
mkdir -p "$build/failures/"

for fuzzer in "$build"/fuzzers/*_fuzzer; do
  name=$(basename "$fuzzer" _fuzzer)
  echo "== $name"
  mkdir -p "$build/corpus/$name"
  options=(-max_total_time="$seconds" -timeout=10 -print_final_stats=1 -artifact_prefix="$build/failures/$name-")
  [[ ! -f fuzz/$name.dict ]] || options+=(-dict="fuzz/$name.dict")
  "$fuzzer" "${options[@]}" "$build/corpus/$name" "fuzz/corpus/$name" 2>&1 | tail -n 40
done
