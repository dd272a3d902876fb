#!/usr/bin/env bash
# make install into a temporary DESTDIR: the files and where they go, that the staged tree works
# (tclsh, kelmarsh, a C++ program through the CMake package and through pkg-config, the
# implementer's example module loaded by tclsh), and that the uninstall leaves nothing behind.
#   install.sh BUILD_DIR VERSION
set -euo pipefail
build=$(cd "$1" && pwd)
version=$2
here=$(cd "$(dirname "$0")" && pwd)
source_dir=$(cd "$here/../.." && pwd)
work=$(mktemp -d)
stage=$work/stage
prefix=/usr/local
root=$stage$prefix
package_dir=$root/lib/tcltk/kelmar$version
design=$source_dir/examples/designs/counter.json

# The install writes its manifest into the build folder: the one of a real install is kept aside.
manifest=$build/install_manifest.txt
[ -e "$manifest" ] && mv "$manifest" "$work/kept_manifest"
finish() {
    if [ -e "$work/kept_manifest" ]; then mv "$work/kept_manifest" "$manifest"; else rm -f "$manifest"; fi
    rm -rf "$work"
}
trap finish EXIT
fail() { echo "install test: $*" >&2; exit 1; }
same() { [ "$2" == "$3" ] || fail "$1: got '$2', want '$3'"; }

# The package folder is one that a stock tclsh searches for this prefix.
paths=$(tclsh8.6 <<< 'puts [join $auto_path \n]')
grep -qx "$prefix/lib/tcltk" <<< "$paths" || fail "$prefix/lib/tcltk is not on tclsh8.6's auto_path"

DESTDIR=$stage cmake --install "$build" --prefix "$prefix" > "$work/install.log"
mv "$manifest" "$work/manifest"

# The installed files below the stage, with the build type in a file name made general.
general() { sed 's|KelmarTargets-.*\.cmake|KelmarTargets-CONFIG.cmake|' | sort; }
listing() { (cd "$stage" && find . ! -type d | sed 's|^\.||' | general); }
{
    echo "$prefix/bin/kelmarsh"
    (cd "$source_dir/include" && find . -name '*.h' | sed "s|^\.|$prefix/include/kelmar|")
    for f in KelmarConfig KelmarConfigVersion KelmarTargets KelmarTargets-CONFIG; do echo "$prefix/lib/cmake/Kelmar/$f.cmake"; done
    echo "$prefix/lib/pkgconfig/kelmar.pc"
    for f in ArgMatchKit KelmarPkg KelmarTool PortBase TcltaskI_Morvane Tcltask_Support; do
        echo "$prefix/lib/tcltk/kelmar$version/lib$f.so"
    done
    echo "$prefix/lib/tcltk/kelmar$version/pkgIndex.tcl"
    echo "$prefix/lib/tcltk/kelmar$version/kelmartool_report.tcl"
    echo "$prefix/lib/tcltk/kelmar$version/kelmartool_show.tcl"
    echo "$prefix/lib/tcltk/kelmar$version/kelmartool_synth.tcl"
    echo "$prefix/lib/tcltk/kelmar$version/kelmartool_delays.json"
} | sort > "$work/expected"
listing | diff "$work/expected" - || fail "the installed files differ from the expected ones (< expected, > installed)"
general < "$work/manifest" | diff "$work/expected" - || fail "the manifest lists other files"
for library in "$package_dir"/*.so; do
    needed=$(readelf -d "$library")
    [[ $needed != *"[libtcl"* ]] || fail "$library needs libtcl: it must reach Tcl through the stubs"
    # FreeType and fontconfig write the labels of the tool's PNG snapshots, in the tool's library alone.
    [[ $library == */libKelmarTool.so || ($needed != *"[libfreetype"* && $needed != *"[libfontconfig"*) ]] ||
        fail "$library needs FreeType or fontconfig, which only the tool's library may link"
done

# A stock tclsh, pointed at the staged tree as it would find $prefix/lib/tcltk by itself: both
# packages load from there, each library of the package folder (the matcher's through the factory).
cat > "$work/run.tcl" <<'EOF'
set package [package require TcltaskI_Morvane 1.0]
package require KelmarTool
kelmartool::open [lindex $argv 0]
kelmartool::collection set regs {r0 r1}
set maps [open /proc/self/maps]
set folders [lsort -unique [lmap {- path} [regexp -all -inline -line {\s(/\S*/lib(?:PortBase|KelmarPkg|ArgMatchKit|Tcltask_Support|TcltaskI_Morvane|KelmarTool)\.so)$} [read $maps]] {
    file dirname $path
}]]
close $maps
puts [list $package [kelmartool::collection sizeof regs] $folders]
EOF
want="$version 2 $package_dir"
same "tclsh" "$(TCLLIBPATH=$root/lib/tcltk tclsh8.6 "$work/run.tcl" "$design")" "$want"
# kelmarsh finds the packages beside itself, with no path given.
same "kelmarsh" "$("$root/bin/kelmarsh" "$work/run.tcl" "$design")" "$want"

# An imported netlist takes its delays from the library installed beside the tool.
cat > "$work/netlist.tcl" <<'EOF'
package require KelmarTool
set fd [open [lindex $argv 0] w]
puts $fd {{"modules": {"t": {"attributes": {"top": 1},
  "ports": {"a": {"direction": "input", "bits": [2]}, "y": {"direction": "output", "bits": [3]}},
  "cells": {"n": {"type": "$_NOT_", "connections": {"A": [2], "Y": [3]}}}}}}}
close $fd
set fd [open [kelmartool::read_netlist [lindex $argv 0]]]
regexp {"delay_library": "([^"]*)"} [read $fd] -> library
close $fd
puts [list [kelmartool::obj get n delay] [file dirname $library]]
EOF
same "the installed delay library" "$(TCLLIBPATH=$root/lib/tcltk tclsh8.6 "$work/netlist.tcl" "$work/not.json")" \
    "0.1 $package_dir"

# A C++ program against the installed headers and libraries, through find_package and pkg-config.
cmake -S "$here" -B "$work/probe" -DCMAKE_PREFIX_PATH="$root" > "$work/probe.log"
cmake --build "$work/probe" >> "$work/probe.log"
want="1 1 46d2ad52-7068-4ab8-81b4-5c9aa2b2cc67"
same "probe built with find_package(Kelmar)" "$("$work/probe/probe")" "$want"
# shellcheck disable=SC2046  # the flags are words
g++ -std=c++20 -Wall -Wextra -Werror "$here/probe.cpp" -o "$work/probe-pc" \
    $(PKG_CONFIG_PATH=$root/lib/pkgconfig pkg-config --cflags --libs "kelmar = $version")
same "probe built with pkg-config" "$("$work/probe-pc")" "$want"

# The implementer's example module, built as the guide says against the installed headers and
# libraries, loaded by a stock tclsh that finds the package in the staged tree.
# shellcheck disable=SC2046  # the flags are words
g++ -std=c++20 -Wall -Wextra -Werror -shared -fPIC -fvisibility=hidden -DUSE_TCL_STUBS -I/usr/include/tcl8.6 \
    "$source_dir/examples/map_collection/map_collection.cpp" -o "$work/libmapcollection.so" \
    $(PKG_CONFIG_PATH=$root/lib/pkgconfig pkg-config --cflags --libs "kelmar = $version") -ltclstub8.6
cat > "$work/module.tcl" <<'EOF'
load [lindex $argv 0] Mapcollection
set c [mapcollection]
$c set nets {a b c}
puts [list [$c append_to nets d a -unique] [$c sizeof [$c get nets]] [package present TcltaskI_Morvane]]
EOF
same "the example module" "$(TCLLIBPATH=$root/lib/tcltk tclsh8.6 "$work/module.tcl" "$work/libmapcollection.so")" \
    "{a b c d} 4 $version"

# Uninstall, as make uninstall does, from the manifest of this install.
DESTDIR=$stage cmake -DMANIFEST="$work/manifest" -P "$build/uninstall.cmake" > "$work/uninstall.log"
left=$(listing)
[ -z "$left" ] || fail "left behind after uninstall: $left"
for folder in lib/tcltk/kelmar$version include/kelmar lib/cmake/Kelmar; do
    [ ! -e "$root/$folder" ] || fail "the folder $prefix/$folder is left behind"
done
echo "install test: passed"
