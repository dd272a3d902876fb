# The reference tool on large designs: whole operations timed against their goals, after the
# per-call bench of bench.tcl. Netlists of 5,000 and 50,000 cells come from
# examples/netlists/generate.tcl and are imported and placed by kelmartool::read_netlist; the
# 50,000-cell design is then timed and every cell visited. A placed design of 100,000 cells, written
# here in the tool's own format (placing that many takes minutes), gives the scene, the SVG snapshot
# and, under a display of its own (xvfb-run -a), the window.
#
#   tclsh8.6 scale.tcl -lib DIR -scratch DIR ?-json FILE? ?-xvfb PROGRAM? ?-repeat N?
#
# -lib is the folder with pkgIndex.tcl, -scratch where the netlists and designs are written, -xvfb
# the xvfb-run that gives the window a display (without it the window is not measured). A figure
# taken more than once (-repeat, default 5; the 50,000-cell import once) is the median, with the
# smallest and largest beside it. Each figure is wall time and the process's CPU time beside it,
# since the machine may be shared. A missed goal is reported, not failed.
#
# The window is measured by the same script in a child process: -part window -design FILE.

namespace eval scale {
    variable opt [dict create -lib {} -scratch {} -json {} -xvfb {} -repeat 5 -part main -design {}]
    variable here [file dirname [file normalize [info script]]]
    variable rows {}
    variable imports 0
    variable started [clock milliseconds]
}

source [file join [file dirname [file normalize [info script]]] options.tcl]

proc scale::Options {argv} {
    variable opt
    benchOptions opt $argv "scale.tcl -lib DIR -scratch DIR ?-json FILE? ?-xvfb PROGRAM? ?-repeat N?"
    foreach name {-lib -scratch} {
        if {[dict get $opt $name] eq {}} { error "missing $name" }
    }
}

# The CPU time of this process so far, in seconds (user and system), from /proc.
proc scale::Cpu {} {
    set f [open /proc/self/stat]
    set stat [read $f]
    close $f
    # The fields after the command name, which is in parentheses and may hold spaces.
    set fields [string range $stat [expr {[string last ) $stat] + 2}] end]
    return [expr {([lindex $fields 11] + [lindex $fields 12]) / 100.0}]
}

# Runs `script` in the caller's frame `times` times, with `before` run first each time (untimed);
# gives a dict of the wall and CPU seconds of every run.
proc scale::Time {times script {before {}}} {
    set walls {}
    set cpus {}
    for {set i 0} {$i < $times} {incr i} {
        if {$before ne {}} { uplevel 1 $before }
        set cpu [Cpu]
        set start [clock microseconds]
        uplevel 1 $script
        lappend walls [expr {([clock microseconds] - $start) / 1e6}]
        lappend cpus [expr {[Cpu] - $cpu}]
    }
    return [dict create walls $walls cpus $cpus]
}

proc scale::Median {values} {
    set sorted [lsort -real $values]
    set n [llength $sorted]
    if {$n % 2} { return [lindex $sorted [expr {$n / 2}]] }
    return [expr {([lindex $sorted [expr {$n / 2 - 1}]] + [lindex $sorted [expr {$n / 2}]]) / 2.0}]
}

# A row of the table: its key, what it measures, its goal in seconds (empty: none) and the times;
# `extra` is a dict of more figures for the JSON (the wire lengths of a placement).
proc scale::Row {key name goal times {extra {}}} {
    variable rows
    set walls [dict get $times walls]
    set row [dict create key $key name $name goal $goal runs [llength $walls] walls $walls \
                 seconds [Median $walls] min [tcl::mathfunc::min {*}$walls] max [tcl::mathfunc::max {*}$walls] \
                 cpu [Median [dict get $times cpus]] extra $extra]
    dict set row met [expr {$goal eq {} ? {} : [dict get $row seconds] < $goal}]
    lappend rows $row
    puts stderr [format "%-44s %8.3f s" $name [dict get $row seconds]]
}

# Writes a netlist of `cells` cells with the example's generator; not timed.
proc scale::Netlist {cells} {
    variable opt
    variable here
    set file [file join [dict get $opt -scratch] netlist$cells.json]
    exec [info nameofexecutable] [file join [file dirname $here] examples netlists generate.tcl] $cells $file -seed 1
    return $file
}

# Imports and places a netlist, and gives the wire lengths the design records, placed and at the
# random start, and their ratio. Each import writes a project file of its own: the one before is
# still open.
proc scale::Import {netlist} {
    variable imports
    set project [file rootname $netlist].[incr imports].design.json
    file delete $project
    kelmartool::read_netlist $netlist -project $project -seed 1
    set f [open $project]
    set text [read $f]
    close $f
    regexp {"wire_length": "(\d+)"} $text -> placed
    regexp {"wire_length_start": "(\d+)"} $text -> start
    return [dict create wire_length $placed wire_length_start $start ratio [format %.4f [expr {double($placed) / $start}]]]
}

# A placed design of `cells` cells in the tool's own format, written directly: a square device a
# little larger than the cells need, LUTs and flip-flops row after row, each cell driving the next
# few, every flip-flop on one clock, a few ports on the west and east edges.
proc scale::PlacedDesign {cells file} {
    set side [expr {int(ceil(sqrt($cells / 0.7))) + 2}]
    set inner [expr {$side - 2}]
    set f [open $file w]
    puts $f "\{\n \"design\": \"placed$cells\",\n \"device\": \{ \"name\": \"grid-${side}x$side\", \"columns\": $side, \"rows\": $side \},"
    puts $f " \"clocks\": \[ \{ \"name\": \"clk\", \"period\": 10, \"net\": \"clk_net\" \} \],"
    set ports {}
    for {set j 0} {$j < 16} {incr j} {
        lappend ports "\{ \"name\": \"in$j\", \"direction\": \"in\", \"site\": \"X0Y[expr {$j + 1}]\" \}" \
            "\{ \"name\": \"out$j\", \"direction\": \"out\", \"site\": \"X[expr {$side - 1}]Y[expr {$j + 1}]\" \}"
    }
    lappend ports "\{ \"name\": \"clk_in\", \"direction\": \"in\", \"site\": \"X0Y[expr {$side - 2}]\" \}"
    puts $f " \"ports\": \[\n  [join $ports ",\n  "]\n \],"
    set items {}
    set flops {}
    for {set i 0} {$i < $cells} {incr i} {
        set site "X[expr {$i % $inner + 1}]Y[expr {$i / $inner + 1}]"
        if {$i % 3 == 2} {
            lappend items "\{ \"name\": \"c$i\", \"type\": \"FF\", \"site\": \"$site\", \"delay\": 0.3, \"setup\": 0.1, \"clock\": \"clk\" \}"
            lappend flops "\"c$i\""
        } else {
            lappend items "\{ \"name\": \"c$i\", \"type\": \"LUT\", \"site\": \"$site\", \"delay\": 0.45 \}"
        }
    }
    puts $f " \"cells\": \[\n  [join $items ",\n  "]\n \],"
    set items [list "\{ \"name\": \"clk_net\", \"driver\": \"clk_in\", \"loads\": \[ [join $flops ", "] \], \"delay\": 0.5 \}"]
    for {set j 0} {$j < 16} {incr j} {
        lappend items "\{ \"name\": \"in${j}_net\", \"driver\": \"in$j\", \"loads\": \[ \"c[expr {$j * $inner}]\" \], \"delay\": 0.2 \}" \
            "\{ \"name\": \"out${j}_net\", \"driver\": \"c[expr {$cells - 1 - 3 * $j}]\", \"loads\": \[ \"out$j\" \], \"delay\": 0.2 \}"
    }
    for {set i 0} {$i < $cells} {incr i} {
        set loads {}
        foreach step {1 2 3} {
            if {$i + $step < $cells} { lappend loads "\"c[expr {$i + $step}]\"" }
        }
        if {[llength $loads]} {
            lappend items "\{ \"name\": \"n$i\", \"driver\": \"c$i\", \"loads\": \[ [join $loads ", "] \], \"delay\": 0.15 \}"
        }
    }
    puts $f " \"nets\": \[\n  [join $items ",\n  "]\n \]\n\}"
    close $f
}

proc scale::Main {} {
    variable opt
    variable here
    set scratch [dict get $opt -scratch]
    set repeat [dict get $opt -repeat]
    file mkdir $scratch
    lappend ::auto_path [dict get $opt -lib]
    package require KelmarTool
    namespace eval :: { namespace import ::kelmartool::* }

    puts stderr "writing the netlists"
    set small [Netlist 5000]
    set large [Netlist 50000]
    Row import5k "5,000 cells: import and place" 10 [Time [expr {min(3, $repeat)}] {set placed [Import $small]}] $placed
    Row import50k "50,000 cells: import and place" 120 [Time 1 {set placed [Import $large]}] $placed

    # The 50,000-cell design stays open.
    timing new scale
    Row timing50k "50,000 cells: timing run" 1 [Time $repeat {timing run scale -overwrite}]
    proc ::scale::visit {} {
        foreach c [search search * -type cell] { obj get $c site }
    }
    Row visit50k "50,000 cells: obj get of every cell's site" 1 [Time $repeat ::scale::visit]

    puts stderr "writing the placed design of 100,000 cells"
    set design [file join $scratch placed100000.json]
    PlacedDesign 100000 $design
    Row open100k "100,000 cells: open the design" {} [Time 1 {kelmartool::open $design}]
    Row scene100k "100,000 cells: scene of the whole device" 1 [Time $repeat {kelmartool::scene}]
    set svg [file join $scratch placed100000.svg]
    Row snapshot100k "100,000 cells: SVG snapshot" 1 [Time $repeat {kelmartool::snapshot $svg}]

    set xvfb [dict get $opt -xvfb]
    if {$xvfb eq {}} {
        puts stderr "no xvfb-run: the window is not measured"
    } else {
        set window [exec $xvfb -a [info nameofexecutable] [info script] -lib [dict get $opt -lib] \
                        -scratch $scratch -repeat $repeat -part window -design $design 2>@ stderr]
        foreach {key name goal times} $window { Row $key $name $goal $times }
    }
}

# In the child process, under a display: the design opened in the window, drawn, then zoomed in.
# Gives the rows for the parent.
proc scale::Window {} {
    variable opt
    lappend ::auto_path [dict get $opt -lib]
    package require KelmarTool
    kelmartool::open [dict get $opt -design]
    set out {}
    # The first draw: Tk loaded, the window made, laid out and drawn.
    set first [Time 1 {
        kelmartool::show .scale
        wm geometry .scale 800x600+0+0
        update
    }]
    if {$::kelmartool::window::redraws < 1} { error "the window did not draw" }
    lappend out window100k "100,000 cells: window opens, first draw" 1 $first
    set drawn $::kelmartool::window::redraws
    lappend out zoom100k "100,000 cells: redraw after zoom -in" 1 [Time [dict get $opt -repeat] {
        kelmartool::view zoom -in
        update
    } {
        kelmartool::view zoom -full
        update
    }]
    # A second zoom leaves fewer cells in view than the density picture takes over at: each is drawn.
    lappend out zoom100kcells "100,000 cells: redraw after 2nd zoom -in" 1 [Time [dict get $opt -repeat] {
        kelmartool::view zoom -in
        update
    } {
        kelmartool::view zoom -full
        kelmartool::view zoom -in
        update
    }]
    if {[llength [.scale.c find withtag kind:cell]] == 0} { error "the second zoom shows no cell one by one" }
    if {$::kelmartool::window::redraws < $drawn + 4} { error "the window did not redraw after the zooms" }
    destroy .scale
    return $out
}

proc scale::Report {} {
    variable rows
    set format "%-44s %9s %9s %9s %9s %7s %s"
    puts [format $format figure seconds min max "cpu s" goal met]
    puts [string repeat - 95]
    foreach row $rows {
        dict with row {
            puts [format $format $name [format %.3f $seconds] [format %.3f $min] [format %.3f $max] \
                      [format %.3f $cpu] [expr {$goal eq {} ? {} : "< $goal"}] \
                      [expr {$met eq {} ? {} : $met ? {yes} : {NO}}]]
            if {[dict exists $extra ratio]} {
                puts [format "    wire length %d, %.1f%% of the random start %d" [dict get $extra wire_length] \
                          [expr {100.0 * [dict get $extra ratio]}] [dict get $extra wire_length_start]]
            }
        }
    }
    variable started
    puts "\nseconds: the median of the runs (wall time), min and max beside it; cpu s: the\
          process's CPU time, median. The whole took [format %.0f [expr {([clock milliseconds] - $started) / 1e3}]] s."
}

proc scale::Json {file} {
    variable rows
    set lines {}
    foreach row $rows {
        dict with row {
            set more {}
            dict for {k v} $extra { append more [format {, "%s": %s} $k $v] }
            lappend lines [format {{"key": "%s", "figure": "%s", "seconds": %.4f, "min": %.4f, "max": %.4f, "cpu_seconds": %.4f, "runs": %d, "walls": [%s], "goal_seconds": %s, "met": %s%s}} \
                               $key $name $seconds $min $max $cpu $runs \
                               [join [lmap w $walls {format %.4f $w}] {, }] \
                               [expr {$goal eq {} ? "null" : $goal}] \
                               [expr {$met eq {} ? "null" : $met ? "true" : "false"}] $more]
        }
    }
    set f [open $file w]
    puts $f "\{\n  \"statistic\": \"median wall seconds over the runs\",\n  \"figures\": \[\n    [join $lines ",\n    "]\n  \]\n\}"
    close $f
}

scale::Options $argv
if {[dict get $scale::opt -part] eq "window"} {
    puts [scale::Window]
    exit 0
}
scale::Main
scale::Report
if {[dict get $scale::opt -json] ne {}} {
    scale::Json [dict get $scale::opt -json]
    puts "\nwritten: [dict get $scale::opt -json]"
}
