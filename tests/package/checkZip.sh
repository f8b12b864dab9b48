#!/bin/sh
# checkZip.sh cmake build source work: makes the ZIP of a build for Windows, unpacks it, plays the example of the README
# with its tool under names beyond ASCII, and builds and runs a consumer in C against it.
set -eu
cmake=$1 build=$2 source=$3 work=$4
run="$source/cmake/mingw/runInWine.sh $build"
rm -rf "$work"
mkdir -p "$work/a folder"

(cd "$build" && "$(dirname "$cmake")/cpack" -B "$work") >"$work/cpack.log"
(cd "$work" && "$cmake" -E tar xf ktorba-*-win64.zip && rm ktorba-*.zip)
package=$(echo "$work"/ktorba-*-win64)

echo '== What is in it'
for file in bin/ktorba.exe bin/ktorba.dll bin/ktorba_host_runtime.dll bin/ktorba/simulator/KtFpga.dll \
  include/ktorba/host_runtime.h lib/libktorba.dll.a lib/ktorba.lib lib/ktorba_elaborating.lib \
  lib/cmake/ktorba/ktorbaConfig.cmake share/doc/ktorba/docs/windows.md share/doc/ktorba/notices/libcli11-dev.txt; do
  [ -s "$package/$file" ] || { echo "lacks $file"; exit 1; }
done

echo '== The tool plays, with names beyond ASCII and blanks in folders, and knows drives'
export LD_LIBRARY_PATH=
cp "$source/examples/radar.kts" "$work/a folder/räder ü€.kts"
cd "$work/a folder"
play() {
  $run "$package/bin/ktorba.exe" play 'räder ü€.kts' --sample-rate 20MHz --waveform "$1" \
    --waveform idle=dc:length=100,amplitude=0 --trigger trigger1@300us --output "$2"
}
play chirp=chirp:length=20us,from=200kHz,to=4MHz 'ä 日本.csv' | tr -d '\r' | tee played.txt
grep -q '^wrote          ä 日本.csv$' played.txt
play "chirp=Z:$work\\a folder\\ä 日本.csv:value,codes" again.csv >/dev/null
cmp 'ä 日本.csv' again.csv >/dev/null && exit 1 # a waveform made of all that was played is longer
[ -s again.csv ]
[ -z "$(find . -name '*.part')" ]

echo '== A consumer finds the package'
"$cmake" -S "$source/tests/install/consumer" -B "$work/consumer" -G Ninja -DCMAKE_PREFIX_PATH="$package" \
  -DCMAKE_TOOLCHAIN_FILE="$source/cmake/mingw.cmake" -DCMAKE_FIND_ROOT_PATH_MODE_PACKAGE=BOTH \
  -DPROGRAM="$source/examples/first_script.c" >"$work/consumer.log"
"$cmake" --build "$work/consumer" >>"$work/consumer.log"
LD_LIBRARY_PATH=$package/bin:$package/bin/ktorba/simulator $run "$work/consumer/consumer.exe" | grep 'played 1453 samples'

echo '== So does a compiler by the other import libraries'
x86_64-w64-mingw32-gcc-posix -DELABORATING=1 -I"$package/include" "$source/tests/package/consumer/consumer.c" \
  "$package/lib/ktorba_elaborating.lib" "$package/lib/ktorba_host_runtime.lib" -o "$work/other.exe"
LD_LIBRARY_PATH=$package/bin $run "$work/other.exe"
