#!/usr/bin/env bash
# Builds the libFuzzer targets with clang (ASan, UBSan), replays each checked-in corpus and
# fuzzes each target for a bounded time. Usage: scripts/run-fuzz.sh [seconds per target]
set -euo pipefail
cd "$(dirname "$0")/.."
ROOT=$PWD
BUILD=${SG_FUZZ_BUILD_DIR:-$ROOT/build-fuzz}
SECONDS_PER_TARGET=${1:-${SG_FUZZ_SECONDS:-30}}

export CCACHE_BASEDIR=$ROOT
launcher=()
command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache -DCMAKE_C_COMPILER_LAUNCHER=ccache)
CC=clang-14 CXX=clang++-14 cmake -S . -B "$BUILD" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
    -DSG_BUILD_FUZZ=ON "${launcher[@]}"
targets=$(cut -d'|' -f1 "$BUILD/fuzzers.txt" | grep -v '^$' || true)
[ -n "$targets" ] || { echo "no fuzz targets"; exit 0; }
cmake --build "$BUILD" -j "$(nproc)" --target $targets

export QT_QPA_PLATFORM=offscreen
export ASAN_OPTIONS=detect_leaks=0:allocator_may_return_null=1
status=0
while IFS='|' read -r name corpus; do
    [ -n "$name" ] || continue
    work=$(mktemp -d)
    echo "== fuzz $name: replaying $corpus"
    "$BUILD/fuzz/$name/$name" -runs=0 "$corpus" || status=1
    echo "== fuzz $name: fuzzing for ${SECONDS_PER_TARGET}s"
    "$BUILD/fuzz/$name/$name" -max_total_time="$SECONDS_PER_TARGET" -print_final_stats=1 \
        -artifact_prefix="$work/" "$work" "$corpus" 2>&1 | tail -n 15 || status=1
    rm -rf "$work"
done < "$BUILD/fuzzers.txt"
echo "fuzzing finished with status $status"
exit $status
