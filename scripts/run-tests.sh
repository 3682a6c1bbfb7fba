#!/usr/bin/env bash
# Sets up, builds and runs every test suite. Usage: scripts/run-tests.sh [ctest args...]
set -euo pipefail
cd "$(dirname "$0")/.."
ROOT=$PWD
BUILD=${SG_BUILD_DIR:-$ROOT/build}
JOBS=${SG_JOBS:-$(nproc)}

bash scripts/setup-deps.sh --tests

export CCACHE_BASEDIR=$ROOT
launcher=()
command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache -DCMAKE_C_COMPILER_LAUNCHER=ccache)

cmake -S . -B "$BUILD" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo \
    -DSG_BUILD_TESTS=ON -DSG_BUILD_BENCH=ON -DSG_REQUIRE_TEST_TOOLS=ON "${launcher[@]}"
cmake --build "$BUILD" -j "$JOBS"

export QT_QPA_PLATFORM=offscreen
status=0
# Sanitized fuzz targets: corpus replay plus a bounded run each (skipped with SG_SKIP_FUZZ=1).
if [ "${SG_SKIP_FUZZ:-0}" != 1 ]; then
    bash scripts/run-fuzz.sh || status=1
fi

# The segment's Win32 back-end: cross build and two-process tests under Wine (skipped with
# SG_SKIP_WINE=1); ctest's own wine test then skips.
if [ "${SG_SKIP_WINE:-0}" != 1 ]; then
    SG_WIN32_BUILD_DIR="$BUILD-win32" bash scripts/run-wine-tests.sh || status=1
    export SG_WINE_TESTS_DONE=1
fi

# The test suites last, so that their summary closes the output.
(cd "$BUILD" && ctest --output-on-failure -j "$JOBS" "$@") || status=1
exit $status
