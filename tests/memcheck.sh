#!/bin/sh
# Runs every Tcl test file under valgrind's memcheck against a plain build. A file fails when one of
# its tests fails, or when valgrind finds a memory error or a definite or indirect leak in its shell
# or in a process it starts (kelmarsh); valgrind's reports of those processes are shown.
#
#   memcheck.sh BUILD_DIR
#
# What valgrind can see of Tcl: Debian's Tcl 8.6 is built threaded, and then takes Tcl_Obj and
# blocks up to 16 KB from pools of its own, carved out of large malloc blocks; no environment
# variable or setting of the library turns those pools off (only a build of Tcl with PURIFY does).
# So memcheck sees the pools and not the single Tcl_Obj in them: a Tcl_Obj used after it went back
# to its pool, or one never given back, goes unseen. Everything the package, the components, the
# kit and the tool allocate with new or malloc is seen one by one. TCL_FINALIZE_ON_EXIT makes Tcl
# finalize fully at exit, as it does for memory checkers, instead of leaving its memory to the
# system: what is lost then is lost by someone.
set -u
[ $# -eq 1 ] || { echo "usage: $0 BUILD_DIR" >&2; exit 2; }
build=$(cd "$1" && pwd)
here=$(cd "$(dirname "$0")" && pwd)
logs=$(mktemp -d "${TMPDIR:-/tmp}/kelmar-memcheck.XXXXXX")
trap 'rm -rf "$logs"' EXIT
trap 'exit 130' INT TERM HUP PIPE

failed=""
for test in "$here"/tcl/*.test; do
    name=$(basename "$test" .test)
    echo "== $name"
    TCL_FINALIZE_ON_EXIT=1 KELMAR_LIB="$build/lib" valgrind --tool=memcheck --quiet --trace-children=yes \
        --error-exitcode=99 --leak-check=full --show-leak-kinds=definite,indirect \
        --errors-for-leak-kinds=definite,indirect --num-callers=40 --keep-debuginfo=yes \
        --suppressions="$here/valgrind.supp" --log-file="$logs/$name.%p.log" \
        tclsh8.6 "$here/tcl/run.tcl" "$test" || failed="$failed $name"
    # With --quiet, a process's log holds something only when valgrind found something.
    for log in "$logs/$name".*.log; do
        if [ -s "$log" ]; then echo "---- valgrind: $(basename "$log")"; cat "$log"; fi
    done
done
if [ -n "$failed" ]; then
    echo "memcheck: failed:$failed"
    exit 1
fi
echo "memcheck: every test file passed with no memory error and no definite or indirect leak"
