#!/bin/sh
# Runs the fuzzer in batches, each a fresh process of the sanitizer build with its own seed, from
# SEED on, until LINES lines have run or a batch fails: it exits non-zero, a sanitizer reports, its
# last line is not "lines N", or it runs longer than TIMEOUT seconds. A failing batch is shown with
# its seed, the last lines it ran and the command that replays it.
#
#   run.sh BUILD_DIR LINES SEED BATCH TIMEOUT WITHOUT
set -u
[ $# -eq 6 ] || { echo "usage: $0 BUILD_DIR LINES SEED BATCH TIMEOUT WITHOUT" >&2; exit 2; }
build=$(cd "$1" && pwd) lines=$2 seed=$3 batch=$4 limit=$5 without=$6
here=$(cd "$(dirname "$0")" && pwd)

# The sanitizer options of the tests, written by the build.
. "$build/sanitizer.env"
export ASAN_OPTIONS LSAN_OPTIONS UBSAN_OPTIONS KELMAR_LIB="$build/lib"

# Everything a batch writes stays in this folder, emptied before each batch and removed at the end.
work=$(mktemp -d "${TMPDIR:-/tmp}/kelmar-fuzz.XXXXXX")
trap 'rm -rf "$work"' EXIT
trap 'exit 130' INT TERM HUP PIPE

ran=0 batches=0 start=$(date +%s)
while [ "$ran" -lt "$lines" ]; do
    n=$((lines - ran < batch ? lines - ran : batch))
    rm -rf "$work/run" && mkdir "$work/run"
    (cd "$work/run" && TMPDIR="$work/run" timeout -k 10 "$limit" "$build/bin/ktclsh" "$here/fuzz.tcl" \
        -seed "$seed" -lines "$n" -without "$without" -log "$work/log") >"$work/out" 2>&1
    code=$?
    if [ $code -ne 0 ] || grep -q 'Sanitizer\|runtime error' "$work/out" || [ "$(tail -n 1 "$work/out")" != "lines $n" ]; then
        echo "fuzz: FAILED at seed $seed (batch of $n lines, exit code $code$([ $code -eq 124 ] && echo ", no end within $limit s"))"
        echo "---- output"
        head -c 20000 "$work/out"
        echo "---- the last lines it ran (nested lines indented)"
        grep -v '^ ' "$work/log" | tail -n 5 | cut -c 1-300
        echo "---- replay"
        echo "make fuzz FUZZ_SEED=$seed FUZZ_LINES=$n FUZZ_BATCH=$n FUZZ_WITHOUT='$without'"
        echo "fuzz: $ran lines ran before"
        exit 1
    fi
    ran=$((ran + n)) seed=$((seed + 1)) batches=$((batches + 1))
done
echo "fuzz: $ran lines in $batches batches up to seed $((seed - 1)), $(($(date +%s) - start)) s, no failure"
