#!/usr/bin/env bash
# The main job in one command, on a fresh Debian 12 machine: installs what is needed, builds the
# application, the plug-in and the reference modeler, and runs the headless demonstration. The
# example figure goes to the modeler, which applies a scripted edit and sends it back; the
# application turns it into a morph with its control property, prints the load log and a summary,
# and writes the figure with the morph at 1 as OBJ into the output folder.
# Usage: scripts/run-demo.sh [OUTPUT_FOLDER]   (default: out/demo)
set -euo pipefail
cd "$(dirname "$0")/.."
ROOT=$PWD
BUILD=${SG_BUILD_DIR:-$ROOT/build}
OUT=$(realpath -m "${1:-$ROOT/out/demo}")

bash scripts/setup-deps.sh

export CCACHE_BASEDIR=$ROOT
launcher=()
command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache -DCMAKE_C_COMPILER_LAUNCHER=ccache)
cmake -S . -B "$BUILD" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo "${launcher[@]}" >/dev/null
cmake --build "$BUILD" --target scenara facbridge Facetor

mkdir -p "$OUT"
# The bridge launches the modeler from its install path; the demonstration's modeler applies a
# scripted edit to what it receives and sends it straight back, then quits. The application's
# settings live in the output folder, so the user's own settings play no part.
export FACETOR_INSTALL_PATH=$BUILD/bin
export FACETOR_WORKSPACE=$OUT/workspace
export FACETOR_LOG=$OUT/facetor.log
export FACETOR_EDIT=${FACETOR_EDIT:-scale=1.25}
export FACETOR_EXPECT=1
export FACETOR_QUIT_WHEN_DONE=1
export SCENARA_SETTINGS=$OUT/scenara.ini
export QT_QPA_PLATFORM=${QT_QPA_PLATFORM:-offscreen}

start=$(date +%s%N)
"$BUILD/bin/scenara" --script examples/demo/send-figure.js -- \
    "$ROOT/examples/demo/scene.json" "$OUT"
end=$(date +%s%N)
echo "Demonstration finished in $(( (end - start) / 1000000 )) ms; output in $OUT"
