#!/usr/bin/env bash
# runInWine.sh BUILD PROGRAM [ARGUMENT...]: runs a Windows program without a display, in a prefix of the build's own.
# Folders of libraries beside the program's own are told as on the building system, in LD_LIBRARY_PATH; where nothing is
# told, the simulator's. The first program waits for the prefix to be made; the server, which takes most of the start,
# stays for the programs that follow, and ends when none has come for a minute.
set -euo pipefail

unset DISPLAY WAYLAND_DISPLAY
build=$1
shift
export WINEPREFIX=$build/wine
export WINEDEBUG=${WINEDEBUG--all} WINEDLLOVERRIDES='mscoree,mshtml=;winemenubuilder.exe=d'

# What Wine leaves running would hold the caller's output open.
in_background() { "$@" >/dev/null 2>&1 9>&-; }

mkdir -p "$WINEPREFIX"
(
  flock 9
  if in_background wineserver --persistent=60; then  # else it is there already
    in_background wine wineboot
  fi
) 9>"$WINEPREFIX/lock"

# "Z:" is the building system's root.
folders=$(tr ':' '\n' <<<"${LD_LIBRARY_PATH-$build/simulator_libraries}" | sed -n 's/^\//Z:\//p' | paste -sd ';')
export WINEPATH=$folders
exec wine "$@"
