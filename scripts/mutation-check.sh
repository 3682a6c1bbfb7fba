#!/usr/bin/env bash
# Applies, one at a time, the small faults listed in scripts/mutations.txt to the product code,
# rebuilds only the tests that cover each, runs them, and prints whether the suite caught it:
#   killed     a test failed on an assertion, a crash or a non-zero exit
#   TIMEOUT    only a time-out caught it: a hang is a hole too (the test should fail fast)
#   survived   every test passed: a hole in the suite
#   stale      the text to mutate is not in the file exactly once: mend the list
#   no-build   the mutated code does not compile: mend the list
# and ends with "N killed, M survived" (time-outs count as survived).
#
# Usage: scripts/mutation-check.sh [--list] [--check] [--only ID[,ID...]] [--timeout SECONDS]
#   --list     prints the entries; --check only tells whether each entry still applies
#   --timeout  the longest run of one mutation's tests (default 240 s: a test that waits for the
#              machine-wide modeler keys lock needs the slack); a test still running
#              then counts as a time-out
# Environment: SG_BUILD_DIR (default build/, configured and built first when missing).
# Not part of the normal test command: it takes about 20 to 30 minutes on two cores.
set -uo pipefail
cd "$(dirname "$0")/.."
ROOT=$PWD
BUILD=${SG_BUILD_DIR:-$ROOT/build}
LIST=$ROOT/scripts/mutations.txt
TEST_TIMEOUT=240
ONLY=""
LIST_ONLY=0
CHECK_ONLY=0

while [ $# -gt 0 ]; do
    case "$1" in
    --list) LIST_ONLY=1 ;;
    --check) CHECK_ONLY=1 ;;
    --only) ONLY=",$2,"; shift ;;
    --timeout) TEST_TIMEOUT=$2; shift ;;
    *) echo "usage: $0 [--list] [--check] [--only ID[,ID...]] [--timeout SECONDS]" >&2; exit 2 ;;
    esac
    shift
done

# The list: blocks of four lines, blank lines and "#" comments between them.
#   @ ID labels=L1[,L2] [tests=REGEX]
#   file: PATH
#   - ORIGINAL TEXT (one line, exactly once in the file, leading blanks ignored)
#   + MUTATED TEXT
ids=() ; labels=() ; tests=() ; files=() ; olds=() ; news=()
while IFS= read -r line || [ -n "$line" ]; do
    case "$line" in
    "@ "*)
        set -- ${line#@ }
        ids+=("$1"); labels+=(""); tests+=(""); files+=(""); olds+=(""); news+=("")
        shift
        for word in "$@"; do
            case "$word" in
            labels=*) labels[-1]=${word#labels=} ;;
            tests=*) tests[-1]=${word#tests=} ;;
            esac
        done ;;
    "file: "*) files[-1]=${line#file: } ;;
    "- "*) olds[-1]=${line#- } ;;
    "+ "*) news[-1]=${line#+ } ;;
    esac
done < "$LIST"

# Replaces the one line holding the original text (leading blanks ignored) with the mutated text,
# keeping its indentation. Exit 3 when the text is on no line or on several.
mutate() {
    MUT_OLD=$1 MUT_NEW=$2 perl -0777 -i -pe '
        my ($old, $new) = ($ENV{MUT_OLD}, $ENV{MUT_NEW});
        my $count = () = /^([ \t]*)\Q$old\E[ \t]*$/mg;
        if ($count != 1) { print STDERR "found $count times\n"; exit 3 }
        s/^([ \t]*)\Q$old\E[ \t]*$/$1$new/m;
    ' "$3"
}

if [ "$CHECK_ONLY" = 1 ]; then
    stale=0
    for i in "${!ids[@]}"; do
        copy=$(mktemp)
        cp "${files[$i]}" "$copy" 2>/dev/null
        if ! mutate "${olds[$i]}" "${news[$i]}" "$copy" 2>/dev/null; then
            printf '%-9s %s (%s)\n' stale "${ids[$i]}" "${files[$i]}"
            stale=$((stale + 1))
        fi
        rm -f "$copy"
    done
    echo "${#ids[@]} mutations, $stale stale"
    [ "$stale" -eq 0 ]
    exit
fi

if [ "$LIST_ONLY" = 1 ]; then
    for i in "${!ids[@]}"; do printf '%-28s %-14s %s\n' "${ids[$i]}" "${labels[$i]}" "${files[$i]}"; done
    echo "${#ids[@]} mutations"
    exit 0
fi

export CCACHE_BASEDIR=$ROOT QT_QPA_PLATFORM=offscreen SG_WINE_TESTS_DONE=1
if [ ! -f "$BUILD/build.ninja" ]; then
    launcher=()
    command -v ccache >/dev/null && launcher=(-DCMAKE_CXX_COMPILER_LAUNCHER=ccache)
    cmake -S . -B "$BUILD" -G Ninja -DCMAKE_BUILD_TYPE=RelWithDebInfo "${launcher[@]}" >/dev/null
fi
echo "== building the unmutated tree"
cmake --build "$BUILD" -j "$(nproc)" >/dev/null || { echo "the unmutated tree does not build" >&2; exit 2; }

current_file=""
backup=$(mktemp)
restore() {
    [ -n "$current_file" ] && cp "$backup" "$current_file"
    current_file=""
}
trap 'restore; rm -f "$backup"; exit 130' INT TERM HUP

killed=0; survived=0; other=0; holes=()
start=$(date +%s)
for i in "${!ids[@]}"; do
    id=${ids[$i]}
    [ -n "$ONLY" ] && [[ "$ONLY" != *",$id,"* ]] && continue
    file=${files[$i]}
    label_regex="^($(echo "${labels[$i]}" | tr ',' '|'))\$"
    selection=(-L "$label_regex")
    [ -n "${tests[$i]}" ] && selection+=(-R "${tests[$i]}")

    cp -p "$file" "$backup"
    current_file=$file
    if ! mutate "${olds[$i]}" "${news[$i]}" "$file" 2>/dev/null; then
        restore
        printf '%-9s %s (%s)\n' stale "$id" "$file"; other=$((other + 1)); continue
    fi
    # Only the tests that cover the mutation are rebuilt (their libraries and helper programs
    # come with them as dependencies).
    targets=$(cd "$BUILD" && ctest -N "${selection[@]}" | sed -n 's/^ *Test *#[0-9]*: //p' |
        grep -v -x shm_wine)
    t0=$(date +%s)
    if ! cmake --build "$BUILD" -j "$(nproc)" --target $targets >/tmp/sg-mutation-build.log 2>&1; then
        restore
        printf '%-9s %s (%s)\n' no-build "$id" "$file"; other=$((other + 1)); continue
    fi
    # Every test carries a time-out of its own (minutes): the stop time caps the whole run of
    # one mutation's tests instead, so that a hang costs at most TEST_TIMEOUT seconds.
    stop=$(date -d "+$TEST_TIMEOUT seconds" +%H:%M:%S)
    output=$(cd "$BUILD" && ctest "${selection[@]}" -j "$(nproc)" --stop-time "$stop" 2>&1)
    restore
    seconds=$(( $(date +%s) - t0 ))
    if echo "$output" | grep -q -E '\*\*\*(Failed|Exception)|SEGFAULT|Subprocess aborted|Child aborted|Not Run'; then
        verdict=killed; killed=$((killed + 1))
        caught_by=$(echo "$output" | grep -E '\*\*\*(Failed|Exception)|SEGFAULT|aborted' |
            sed -n 's/.*Test *#[0-9]*: \([^ ]*\).*/\1/p' | sort -u | tr '\n' ' ')
    elif echo "$output" | grep -q '\*\*\*Timeout'; then
        verdict=TIMEOUT; survived=$((survived + 1)); holes+=("$id (time-out)")
        caught_by=$(echo "$output" | grep '\*\*\*Timeout' |
            sed -n 's/.*Test *#[0-9]*: \([^ ]*\).*/\1/p' | tr '\n' ' ')
    else
        verdict=survived; survived=$((survived + 1)); holes+=("$id"); caught_by=""
    fi
    printf '%-9s %-28s %4ss  %s\n' "$verdict" "$id" "$seconds" "$caught_by"
done
rm -f "$backup"
trap - INT TERM HUP

echo "== restoring the build"
cmake --build "$BUILD" -j "$(nproc)" >/dev/null
echo "elapsed: $(( $(date +%s) - start )) s"
[ ${#holes[@]} -gt 0 ] && echo "holes: ${holes[*]}"
[ "$other" -gt 0 ] && echo "$other entries stale or not building: mend scripts/mutations.txt"
echo "$killed killed, $survived survived"
[ "$survived" -eq 0 ] && [ "$other" -eq 0 ]
