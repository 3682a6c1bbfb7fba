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
# Crash, leak and time-out reproducers are kept in build-fuzz/artifacts/<target>/ (outside the
# source tree); only the inputs that a run adds to its scratch corpus are thrown away.
while IFS='|' read -r name corpus; do
    [ -n "$name" ] || continue
    work=$(mktemp -d)
    artifacts="$BUILD/artifacts/$name"
    mkdir -p "$artifacts"
    echo "== fuzz $name: replaying $corpus"
    "$BUILD/fuzz/$name/$name" -runs=0 -artifact_prefix="$artifacts/" "$corpus" || status=1
    echo "== fuzz $name: fuzzing for ${SECONDS_PER_TARGET}s"
    set +o pipefail
    "$BUILD/fuzz/$name/$name" -max_total_time="$SECONDS_PER_TARGET" -print_final_stats=1 \
        -artifact_prefix="$artifacts/" "$work" "$corpus" 2>&1 | tail -n 15
    [ "${PIPESTATUS[0]}" -eq 0 ] || status=1
    set -o pipefail
    rm -rf "$work"
    if compgen -G "$artifacts/*" >/dev/null; then
        echo "== fuzz $name: reproducers kept in $artifacts:"
        ls -1 "$artifacts"
    fi
done < "$BUILD/fuzzers.txt"
echo "fuzzing finished with status $status"
exit $status
