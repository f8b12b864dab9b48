#!/usr/bin/env bash
# Runs random operations on several simulated generators, each call compared with a model, and watches memory.
#
#   [KTORBA_SEED=SEED] scripts/soak.sh [OPERATIONS]     ten million operations, seed 1, when not given
set -euo pipefail
cd "$(dirname "$0")/.."

scripts/setup.sh build
cmake --preset release
cmake --build --preset release --target ktorba_soak
build/release/tests/soak/ktorba_soak "${1:-10000000}"
