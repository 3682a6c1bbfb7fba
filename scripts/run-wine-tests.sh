#!/usr/bin/env bash
# Cross-builds the segment's Win32 back-end and its two-process tests with mingw-w64 (Qt-free,
# statically linked) and runs them under Wine, headless.
# Usage: scripts/run-wine-tests.sh [--run-only]
#   --run-only: run an existing cross build; exits 77 (skipped) when there is none.
# Wine stands in for Windows here: it shows the calls and their semantics, not Windows itself.
set -euo pipefail
cd "$(dirname "$0")/.."
ROOT=$PWD
BUILD=${SG_WIN32_BUILD_DIR:-$ROOT/build-win32}
WINE=${SG_WINE:-/usr/lib/wine/wine64}
WINESERVER=${SG_WINESERVER:-/usr/lib/wine/wineserver}
[ -x "$WINESERVER" ] || WINESERVER=wineserver
TEST_EXE=$BUILD/tests/shm/shm_win32_test.exe
export WINEPREFIX=${SG_WINEPREFIX:-$BUILD/wineprefix}
export WINEDEBUG=-all

if [ "${1:-}" = "--run-only" ]; then
    # scripts/run-tests.sh runs this script itself before ctest and sets SG_WINE_TESTS_DONE.
    [ "${SG_WINE_TESTS_DONE:-0}" != 1 ] || { echo "already run by scripts/run-tests.sh: skipped"; exit 77; }
    [ -x "$TEST_EXE" ] && [ -f "$WINEPREFIX/system.reg" ] || { echo "no Win32 build: skipped"; exit 77; }
else
    export CCACHE_BASEDIR=$ROOT
    launcher=()
    command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache -DCMAKE_C_COMPILER_LAUNCHER=ccache)
    cmake -S . -B "$BUILD" -G Ninja -DCMAKE_TOOLCHAIN_FILE="$ROOT/cmake/mingw-w64-x86_64.cmake" \
        -DSG_ONLY_SHM_WIN32=ON -DCMAKE_BUILD_TYPE=RelWithDebInfo "${launcher[@]}"
    cmake --build "$BUILD" --target shm_win32_test shm_peer
fi

# Stop the prefix's wine server however the run ends, so that nothing stays behind.
trap '"$WINESERVER" -k >/dev/null 2>&1 || true' EXIT
if [ ! -f "$WINEPREFIX/system.reg" ]; then
    echo "== creating the Wine prefix $WINEPREFIX (once)"
    timeout 300 "$WINE" wineboot --init >/dev/null 2>&1
    "$WINESERVER" -w
fi
echo "== Win32 segment tests under Wine"
timeout 300 "$WINE" "$TEST_EXE"
