#!/usr/bin/env bash
# Installs what the project needs on Debian 12, idempotently. Waits while another apt holds the lock.
# Usage: scripts/setup-deps.sh           the build tools and Qt: enough to build and run the
#                                        application, the plug-in and the reference modeler
#        scripts/setup-deps.sh --tests   the same plus the test tools (GoogleTest, Google
#                                        Benchmark, the fuzzing runtime, the cross compiler, Wine)
set -euo pipefail

PACKAGES=(
    build-essential cmake ninja-build ccache pkg-config
    qt6-base-dev qt6-declarative-dev
)
TEST_PACKAGES=(
    libgtest-dev libgmock-dev libbenchmark-dev libtinyobjloader-dev
    clang-14 libfuzzer-14-dev libclang-rt-14-dev
    g++-mingw-w64-x86-64-posix wine64
)
case "${1:-}" in
    "") ;;
    --tests) PACKAGES+=("${TEST_PACKAGES[@]}") ;;
    *) echo "usage: $0 [--tests]" >&2; exit 2 ;;
esac

missing=()
for p in "${PACKAGES[@]}"; do
    dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed" || missing+=("$p")
done
[ ${#missing[@]} -eq 0 ] && exit 0

SUDO=""
[ "$(id -u)" -ne 0 ] && SUDO="sudo"
apt_retry() {
    for attempt in $(seq 1 60); do
        if $SUDO env DEBIAN_FRONTEND=noninteractive apt-get -o DPkg::Lock::Timeout=60 "$@"; then
            return 0
        fi
        echo "apt-get $1 failed (attempt $attempt); retrying in 10 s" >&2
        sleep 10
    done
    return 1
}
echo "Installing: ${missing[*]}"
apt_retry update -q
apt_retry install -y -q --no-install-recommends "${missing[@]}"
