#!/usr/bin/env bash
# Installs the Debian packages that this project needs and the machine lacks. Quick when nothing is missing.
#
#   scripts/setup.sh [GROUP...]     groups: build (when none is named), checks, windows, demo, benchmarks,
#                                   all
#
# Needs root or sudo only when something is missing.
set -euo pipefail

# Group, package, what it is for.
packages='
build      build-essential          C and C++ compilers
build      cmake                    configures the build
build      ninja-build              runs the build
build      pkg-config               finds the libraries below; one of the two ways to use the installed library
build      libboost-dev             pointers, containers and the timed mutex, headers only
build      libutfcpp-dev            checks UTF-8 at the boundary
build      libcli11-dev             command line of the tool
build      nlohmann-json3-dev       JSON that the tool reads and prints
build      libsndfile1-dev          sound files that the tool reads and writes
build      libsamplerate0-dev       rates of sound and samples that the tool reads
build      libzip-dev               archives of arrays that the tool reads
build      libcairo2-dev            pictures that the tool draws
build      libgtest-dev             tests
build      libgmock-dev             matchers and mocks in tests
build      chromium-headless-shell  a browser that tests look at pages with
build      python3-numpy            arrays, which the Python package takes and gives
build      python3-pytest           tests of the Python package
build      mypy                     checks the types that the Python package promises
build      unicode-data             the data that the case-folding table is made from and tested against
checks     clang-format             format of the sources
checks     clang-tidy               static analysis
checks     clang                    builds the fuzzers
checks     libclang-rt-dev          libFuzzer
checks     gcovr                    counts the lines that tests reach
windows    g++-mingw-w64-x86-64-posix  builds for Windows
windows    llvm                     makes import libraries for the other usual compiler
windows    googletest               tests, from their sources
windows    wine                     runs what was built for Windows
windows    wine64                   the same, for 64 bits
demo       sox                      plays and measures sound
demo       sound-theme-freedesktop  sounds to turn into waveforms
benchmarks libbenchmark-dev         measures
benchmarks spirv-tools              a compiler of similar size to compare with
benchmarks wabt                     a text-to-binary translator to compare with
benchmarks liblua5.4-dev            a script compiler to compare with
'

missing_packages() {
  local group package
  while read -r group package _; do
    [[ -n $group && " $* " == *" $group "* ]] || continue
    [[ $(dpkg-query -W -f='${db:Status-Status}' "$package" 2>/dev/null) == installed ]] || echo "$package"
  done <<<"$packages"
}

groups=${*:-build}
[[ $groups != all ]] || groups='build checks windows demo benchmarks'
mapfile -t missing < <(missing_packages "$groups")
[[ ${#missing[@]} -gt 0 ]] || exit 0

echo "installing ${missing[*]}"
as_root=()
[[ $(id -u) == 0 ]] || as_root=(sudo)
"${as_root[@]}" apt-get update -q
"${as_root[@]}" env DEBIAN_FRONTEND=noninteractive apt-get install -q -y --no-install-recommends "${missing[@]}"
