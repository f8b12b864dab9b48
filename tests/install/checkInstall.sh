#!/bin/sh
# checkInstall.sh cmake build source work libdir: installs a build whole, uses what is there as its users do, with
# nothing but the installed tree on a search path, and uninstalls it. CC and CFLAGS are those of the build.
set -eu
cmake=$1 build=$2 source=$3 work=$4
prefix=$work/prefix libdir=$work/prefix/$5
unset LD_LIBRARY_PATH
export PKG_CONFIG_PATH="$libdir/pkgconfig"

fail() {
  echo "$*"
  exit 1
}

cc() {
  # Flags are a list of words.
  # shellcheck disable=SC2086
  "$CC" ${CFLAGS-} "$@"
}

stage() {
  sh "$source/tests/install/stage.sh" "$cmake" "$build" "$work/lists" --prefix "$prefix" "$@" >>"$work/install.log"
}

uninstall() {
  "$cmake" -DMANIFESTS="$work/lists" -P "$source/cmake/uninstall.cmake" >"$work/uninstall.log"
}

rm -rf "$work"
mkdir -p "$work"
stage

echo '== No library that the hardware brings lies where every program finds it'
shadows=$(find "$libdir" "$prefix/bin" -maxdepth 1 \( -name '*KtFpga*' -o -name '*ktifwu*' \))
[ -z "$shadows" ] || fail "$shadows"

echo '== The tool plays a script'
"$prefix/bin/ktorba" play "$source/examples/camera.kts" --waveform flash=gauss:length=100us --output "$work/camera.csv"

cd "$work"
for example in first_script streaming_host; do
  command=$(sed -n '/^ \*   cc /,/a\.out/s/^ \* *//p' "$source/examples/$example.c")
  echo "== $command"
  cp "$source/examples/$example.c" .
  eval "$command" || fail 'the command of its comment fails'

  echo "== $example by find_package"
  "$cmake" -S "$source/tests/install/consumer" -B "$example" -DCMAKE_PREFIX_PATH="$prefix" \
    -DPROGRAM="$source/examples/$example.c" >"$example.log"
  "$cmake" --build "$example" >>"$example.log"
  "$example/consumer"
done

echo '== Without platform libraries the first program says what it did not find, and where'
# shellcheck disable=SC2046
cc first_script.c $(pkg-config --cflags --libs ktorba_elaborating ktorba_host_runtime) -lktorba_simulator -lm -o bare
! LD_LIBRARY_PATH=$libdir ./bare 2>bare.log || fail 'it found some'
grep -q -- '-52003.*"libktifwu.so: cannot open.*"libktifwu.so":"looked for .*'"$libdir" bare.log || fail "$(cat bare.log)"

echo '== With those on the loader path it plays'
LD_LIBRARY_PATH=$libdir:$libdir/ktorba/simulator ./bare

echo '== Uninstalling leaves what others have put there'
touch "$prefix/include/ktorba/other.h"
uninstall
[ "$(find "$prefix" ! -type d)" = "$prefix/include/ktorba/other.h" ] || fail "left: $(find "$prefix" ! -type d)"
rm -r "$prefix/include/ktorba"

echo '== Components, one by one'
for component in library simulator; do
  stage --component $component
done
uninstall
[ -z "$(find "$prefix" ! -type d -o -name ktorba)" ] || fail "left: $(find "$prefix")"
