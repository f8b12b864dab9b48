#!/bin/sh
# stage.sh cmake build lists [argument...]: cmake --install with these arguments. The lists of what it installed go to
# the folder `lists`; those of an install that is not a test's stay in the build, or it could not be uninstalled.
set -eu
cmake=$1 build=$2 lists=$3
shift 3

move_lists() {
  find "$1" -maxdepth 1 -name 'install_manifest*.txt' -exec mv {} "$2" \;
}

put_back() {
  move_lists "$build" "$lists"
  move_lists "$lists/kept" "$build"
}

mkdir -p "$lists/kept"
move_lists "$build" "$lists/kept"
trap put_back EXIT
trap 'exit 1' INT TERM
"$cmake" --install "$build" "$@"
