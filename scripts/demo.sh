#!/usr/bin/env bash
# Sets up, builds, and plays the example scripts on a simulated generator; then tells what to look at.
#
#   scripts/demo.sh [--build FOLDER]     results go to out/; the build goes to build/release unless FOLDER is given
set -euo pipefail
cd "$(dirname "$0")/.."

build=build/release
[[ ${1:-} != --build ]] || build=$2
sounds=/usr/share/sounds/freedesktop/stereo

echo "== Setting up"
scripts/setup.sh build demo

echo "== Building (the first time takes a few minutes)"
cmake --preset release -B "$build" -DKTORBA_BUILD_TESTS=OFF >/dev/null
cmake --build "$build" --target ktorba_tool streaming_host
ktorba() { "$build/cli/ktorba" "$@"; }

mkdir -p out
echo "== A pulse train for a camera"
ktorba play examples/camera.kts --waveform flash=gauss:length=100us --output out/camera.svg --output out/camera.vcd

echo "== Radar chirps until a trigger"
ktorba play examples/radar.kts --sample-rate 20MHz \
  --waveform chirp=chirp:length=20us,from=200kHz,to=4MHz --waveform idle=dc:length=100,amplitude=0 \
  --trigger trigger1@300us --output out/radar.png --output out/radar.csv --output out/radar.html

echo "== The same, drawn by computing: its first two chirps"
ktorba plot examples/radar.kts --sample-rate 20MHz --length 120us --style dark \
  --waveform chirp=chirp:length=20us,from=200kHz,to=4MHz --waveform idle=dc:length=100,amplitude=0 \
  --trigger trigger1@300us --output out/chirps.svg

echo "== A recorded voice in slices"
ktorba play examples/slices.kts --sample-rate 48000 --waveform voice=$sounds/audio-channel-front-left.oga:1 \
  --output out/slices.wav --output out/slices.png

echo "== A host in C that keeps writing while the generator plays (examples/streaming_host.c)"
"$build/examples/streaming_host"

cat <<'WORDS'

Look at   out/radar.png    samples, what plays, markers and the trigger, over time
          out/radar.html   the same in a browser, to walk through
          out/chirps.svg   two of its chirps, in dark
          out/camera.svg   the picture of the camera's pulses; out/camera.vcd for a waveform viewer
          out/slices.png   and listen to out/slices.wav:  play out/slices.wav
Then try  ktorba check, disassemble, fit, plot and errors; ktorba --help shows examples of each.
WORDS
