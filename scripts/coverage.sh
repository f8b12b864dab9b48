#!/usr/bin/env bash
# Prints how many lines of the library the tests reach, and in each file those that they do not reach.
# Fails below 95 %. The simulator, the tool and the tests themselves are not counted.
#
#   scripts/coverage.sh             builds the preset `coverage` and runs its tests first
#   scripts/coverage.sh --report    the tests of build/coverage have run
set -euo pipefail
cd "$(dirname "$0")/.."

if [[ ${1:-} != --report ]]; then
  scripts/setup.sh build checks
  [[ ! -d build/coverage ]] || find build/coverage -name '*.gcda' -delete  # counts of earlier runs
  scripts/test.sh coverage
fi

# Throw branches are left out: every call has one. Files that are reached whole are not listed.
gcovr --root . --object-directory build/coverage build/coverage \
  --filter '(kt[^/]*|ktorba/[^/]*|source/ktorba_lib|platform/[^/]*|platform/system/posix)/[^/]*$' --exclude '.*/describeErrors\.cpp' \
  --exclude-directories '.*/(CompilerIdC|CompilerIdCXX|tests/package)' --exclude-throw-branches \
  --print-summary --fail-under-line 95 |
  awk 'NF == 1 && !/^-/ { name = $0; next } { print name $0; name = "" }' |  # long names stand on a line of their own
  grep -v '100%'
