# The cost of one call of the package, measured against three baselines in the same process:
# a native command (the limit), a SWIG-generated binding and plain Tcl. Every case runs in a
# compiled loop; within a round the cases take turns in short slices, so a slow moment of the
# machine falls on all of them alike, and each ratio is taken within one round. Then one million
# calls each of a matched method and of a method that hands out an object, with the resident memory
# and the object commands counted before and after: both must stay flat.
#
#   tclsh8.6 bench.tcl -lib DIR -native FILE ?-swig FILE? ?-json FILE?
#                      ?-rounds N? ?-seconds S? ?-calls N?
#
# -lib is the folder with pkgIndex.tcl, -native and -swig the baseline extensions, -seconds the
# time one case takes in one round, -calls the length of each memory run. Exits 1 when memory or
# the command count grows.

namespace eval bench {
    variable opt [dict create -lib {} -native {} -swig {} -json {} -rounds 7 -seconds 1.0 \
                      -calls 1000000]
    # Calls run in chunks of this many, so the kit's call records can be dropped between chunks.
    variable chunk 1000
    # The turns that the cases take within one round.
    variable slices 10
    # Growth of the resident set, in kB, that a memory run may show before it counts as a leak:
    # allocator slack, not a per-call loss, which at a million calls would be far larger.
    variable rssSlackKb 4096
}

proc bench::Options {argv} {
    variable opt
    if {[llength $argv] % 2} {
        error "usage: bench.tcl -lib DIR -native FILE ?-swig FILE? ?-json FILE? ?-rounds N? ?-seconds S? ?-calls N?"
    }
    foreach {name value} $argv {
        if {![dict exists $opt $name]} {
            error "unknown option \"$name\": must be one of [join [dict keys $opt] {, }]"
        }
        dict set opt $name $value
    }
    foreach name {-lib -native} {
        if {[dict get $opt $name] eq {}} {error "missing $name"}
    }
}

# A case: its key, its name, the command as a script writes it, and the kit object whose records
# are dropped after each chunk (empty for the baselines, which keep none).
proc bench::Case {key name command {kit {}}} {
    variable cases
    dict set cases $key [dict create name $name command $command kit $kit]
}

proc bench::Setup {} {
    variable opt
    lappend ::auto_path [dict get $opt -lib]
    package require TcltaskI_TestKit
    source [file join [file dirname [info script]] plain.tcl]
    load [dict get $opt -native] Benchnative
    if {[dict get $opt -swig] ne {}} {
        load [dict get $opt -swig] Benchsink
    }

    set ::project [testkit::new ITclProject]
    set ::coll [testkit::new ICollection]
    set ::sel [testkit::new ISelection]
    set ::search [testkit::new ISearch]
    set ::view [testkit::new IGraphicalView]
    set ::hl [testkit::new IHighlight]
    set ::plain [PlainCollection new]
    # The default colour of the highlight's add asks this command on every call.
    proc ::highlight {args} {return red}
    # The switch methods take the property component library for granted; a matched method loads it.
    $::coll get x

    Case native "native limit" {benchnative x}
    if {[dict get $opt -swig] ne {}} {
        set ::sink [benchsink::new_Sink]
        Case swig "SWIG binding" {$sink Take x}
    }
    Case plain "plain Tcl (TclOO)" {$plain equal a b -order}
    Case loop "loop alone (in every row)" {}
    Case close "plain method" {$project Close} project
    Case sync "plain method with OUT variable" {$project Sync msg} project
    Case get "matched, no options" {$coll get x} coll
    Case equal "matched, one bool option given" {$coll equal a b -order} coll
    Case add "matched, tail of 8" {$sel add a b c d e f g h} sel
    Case search "matched, list options" {$search search x -type a -type b -in c} search
    Case zoom "switch, eleven options" {$view zoom -in -name n} view
    Case hl "default that runs a command" {$hl add a} hl
}

# The loop of one command as a compiled proc taking a count of chunks. The object words are copied
# into locals first, so the loop body is what a script's own loop would run.
proc bench::MakeLoop {name command kit} {
    variable chunk
    set locals {}
    foreach var [regexp -all -inline {\$(\w+)} $command] {
        if {[string index $var 0] ne "\$"} {
            append locals "set $var \$::$var\n"
        }
    }
    if {$kit ne {}} {
        append locals "set kit \$::$kit\n"
        # The kit keeps every call and every component's end until asked: drop both, or the
        # records would fill memory and slow the calls that follow.
        set drop {testkit::reset $kit; testkit::events}
    } else {
        set drop {}
    }
    proc $name {chunks} [string map [list @LOCALS@ $locals @COMMAND@ $command @DROP@ $drop \
                                         @CHUNK@ $chunk] {
        @LOCALS@
        for {set c 0} {$c < $chunks} {incr c} {
            for {set i 0} {$i < @CHUNK@} {incr i} {
                @COMMAND@
            }
            @DROP@
        }
    }]
}

# Microseconds that the loop takes for so many chunks.
proc bench::Time {loop chunks} {
    set start [clock microseconds]
    $loop $chunks
    return [expr {[clock microseconds] - $start}]
}

# The count of chunks that fills the wanted seconds, from a run long enough to be measured.
proc bench::Calibrate {loop} {
    variable opt
    set chunks 1
    while {[set used [Time $loop $chunks]] < 50000} {
        set chunks [expr {$chunks * 4}]
    }
    return [expr {max(1, round($chunks * [dict get $opt -seconds] * 1e6 / $used))}]
}

proc bench::Median {values} {
    set sorted [lsort -real $values]
    set n [llength $sorted]
    if {$n % 2} {
        return [lindex $sorted [expr {$n / 2}]]
    }
    return [expr {([lindex $sorted [expr {$n / 2 - 1}]] + [lindex $sorted [expr {$n / 2}]]) / 2.0}]
}

proc bench::Measure {} {
    variable opt
    variable cases
    variable chunk
    variable slices
    set keys [dict keys $cases]
    foreach key $keys {
        dict with cases $key {
            MakeLoop ::bench::loop_$key $command $kit
        }
        dict set cases $key chunks [Calibrate ::bench::loop_$key]
        set times($key) {}
        set ratios($key) {}
    }
    set rounds [dict get $opt -rounds]
    for {set r 0} {$r < $rounds} {incr r} {
        set used [dict map {key case} $cases {expr 0}]
        set calls [dict map {key case} $cases {expr 0}]
        # A round runs every case in slices, taking turns, so that a busy moment of the machine
        # falls on all cases of the round alike; each slice starts one case later than the last.
        for {set s 0} {$s < $slices} {incr s} {
            set shift [expr {($r * $slices + $s) % [llength $keys]}]
            foreach key [concat [lrange $keys $shift end] [lrange $keys 0 [expr {$shift - 1}]]] {
                set chunks [expr {max(1, [dict get $cases $key chunks] / $slices)}]
                dict incr used $key [Time ::bench::loop_$key $chunks]
                dict incr calls $key [expr {$chunks * $chunk}]
            }
        }
        foreach key $keys {
            set ns($key) [expr {[dict get $used $key] * 1000.0 / [dict get $calls $key]}]
            lappend times($key) $ns($key)
            dict set cases $key calls [dict get $calls $key]
        }
        foreach key $keys {
            lappend ratios($key) [expr {$ns($key) / $ns(native)}]
        }
        puts stderr "round [expr {$r + 1}]/$rounds done"
    }
    foreach key $keys {
        dict set cases $key rounds $times($key)
        dict set cases $key ns [Median $times($key)]
        dict set cases $key ratio [Median $ratios($key)]
    }
}

proc bench::Rss {} {
    set f [open /proc/self/status]
    set status [read $f]
    close $f
    if {![regexp -line {^VmRSS:\s+(\d+)\s+kB} $status -> kb]} {
        error "no VmRSS in /proc/self/status"
    }
    return $kb
}

proc bench::Commands {} {
    return [llength [info commands ::kelmar::*]]
}

# A memory run: a warm-up that makes whatever the first calls make for good, then the calls
# between two readings of the resident set and of the object commands.
proc bench::MemoryRun {key command kit} {
    variable opt
    variable chunk
    variable rssSlackKb
    MakeLoop ::bench::mem_$key $command $kit
    set chunks [expr {max(1, [dict get $opt -calls] / $chunk)}]
    ::bench::mem_$key [expr {max(1, $chunks / 100)}]
    set rssBefore [Rss]
    set cmdsBefore [Commands]
    ::bench::mem_$key $chunks
    set rssAfter [Rss]
    set cmdsAfter [Commands]
    set ok [expr {$cmdsAfter <= $cmdsBefore && $rssAfter - $rssBefore <= $rssSlackKb}]
    return [dict create command $command calls [expr {$chunks * $chunk}] \
                rss_kb_before $rssBefore rss_kb_after $rssAfter \
                commands_before $cmdsBefore commands_after $cmdsAfter ok $ok]
}

proc bench::Memory {} {
    variable memory
    proc ::bench::same {args} {return {object same}}
    set ::hdproject [testkit::new ITclProject -handler ::bench::same]
    set memory [list \
        [MemoryRun equal {$coll equal a b -order} coll] \
        [MemoryRun hd {$hdproject GetHDProject} hdproject]]
}

proc bench::Report {} {
    variable cases
    variable memory
    set format "%-32s %-40s %10s %9s %12s"
    puts [format $format case command ns/call "x native" calls/round]
    puts [string repeat - 107]
    dict for {key case} $cases {
        dict with case {
            puts [format $format $name $command [format %.1f $ns] [format %.2f $ratio] $calls]
        }
    }
    puts ""
    set format "%-32s %10s %10s %10s %10s %10s  %s"
    puts [format $format "memory run" calls "RSS kB" after commands after ""]
    puts [string repeat - 107]
    foreach run $memory {
        dict with run {
            puts [format $format $command $calls $rss_kb_before $rss_kb_after $commands_before \
                      $commands_after [expr {$ok ? "flat" : "GROWS"}]]
        }
    }
}

proc bench::JsonString {text} {
    return "\"[string map {\\ \\\\ \" \\\" \n \\n \t \\t} $text]\""
}

proc bench::Json {file} {
    variable opt
    variable cases
    variable memory
    set rows {}
    dict for {key case} $cases {
        dict with case {
            lappend rows [format {    {"key": %s, "case": %s, "command": %s, "ns_per_call": %.2f, "ratio_to_native": %.3f, "calls_per_round": %d, "rounds_ns": [%s]}} \
                              [JsonString $key] [JsonString $name] [JsonString $command] $ns $ratio $calls \
                              [join [lmap v $rounds {format %.2f $v}] {, }]]
        }
    }
    set runs {}
    foreach run $memory {
        dict with run {
            lappend runs [format {    {"command": %s, "calls": %d, "rss_kb_before": %d, "rss_kb_after": %d, "commands_before": %d, "commands_after": %d, "flat": %s}} \
                              [JsonString $command] $calls $rss_kb_before $rss_kb_after \
                              $commands_before $commands_after [expr {$ok ? "true" : "false"}]]
        }
    }
    set f [open $file w]
    puts $f "\{"
    puts $f "  \"rounds\": [dict get $opt -rounds],"
    puts $f "  \"seconds_per_round\": [dict get $opt -seconds],"
    puts $f "  \"statistic\": \"median over rounds; ratio is the median of per-round ratios to native\","
    puts $f "  \"cases\": \[\n[join $rows ",\n"]\n  \],"
    puts $f "  \"memory\": \[\n[join $runs ",\n"]\n  \]"
    puts $f "\}"
    close $f
}

proc bench::Main {argv} {
    variable opt
    variable memory
    Options $argv
    Setup
    Measure
    Memory
    Report
    if {[dict get $opt -json] ne {}} {
        Json [dict get $opt -json]
        puts "\nwritten: [dict get $opt -json]"
    }
    foreach run $memory {
        if {![dict get $run ok]} {
            puts stderr "memory or object commands grow under [dict get $run command]"
            exit 1
        }
    }
}

bench::Main $argv
