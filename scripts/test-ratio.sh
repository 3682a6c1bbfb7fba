#!/usr/bin/env bash
# Prints the test code's size against the product code's: non-blank lines of the .cpp and .h
# files git tracks under tests/ and under the product folders. Benchmarks and fuzz targets count
# as neither. Exit status 1 when the tests exceed the limit (default 33 %, SG_TEST_RATIO_MAX).
set -euo pipefail
cd "$(dirname "$0")/.."

PRODUCT=(sgcore exchange bridge sharedsource app facetor)
LIMIT=${SG_TEST_RATIO_MAX:-33}

lines() {
    git ls-files -z -- "$@" | grep -z -E '\.(cpp|h)$' | xargs -0 -r cat | grep -c -v -E '^\s*$' || true
}

tests=$(lines tests)
product=$(lines "${PRODUCT[@]}")
percent=$(awk -v t="$tests" -v p="$product" 'BEGIN { printf "%.1f", (p > 0 ? 100 * t / p : 0) }')
echo "tests: $tests lines; product (${PRODUCT[*]}): $product lines; ratio $percent %"
awk -v r="$percent" -v l="$LIMIT" 'BEGIN { exit !(r <= l) }' || {
    echo "above $LIMIT %" >&2
    exit 1
}
