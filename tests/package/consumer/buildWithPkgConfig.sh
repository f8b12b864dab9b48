#!/bin/sh
# buildWithPkgConfig.sh library libdir program: builds consumer.c against an installed library and runs it.
set -eu
library=$1 libdir=$2 program=$3
case $library in *elaborating) elaborating=1 ;; *) elaborating=0 ;; esac
export PKG_CONFIG_PATH="$libdir/pkgconfig"
# Flags are lists of words.
# shellcheck disable=SC2046,SC2086
"$CC" ${CFLAGS-} -DELABORATING=$elaborating $(pkg-config --cflags "$library") "$(dirname "$0")/consumer.c" \
  $(pkg-config --libs "$library") -o "$program"
LD_LIBRARY_PATH="$libdir" "$program"
