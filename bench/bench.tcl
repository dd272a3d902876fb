# The cost of one call of the package, measured against three baselines in the same process:
# a native command (the limit), a SWIG-generated binding and plain Tcl, then a few calls of the
# reference tool. Every case runs in a compiled loop and calls its command through a variable, as a
# script calls an object.
#
# Two modes. In time (the default), within a round the cases take turns in short slices, so a slow
# moment of the machine falls on all of them alike, and each ratio is taken within one round. Then
# one million calls each of a matched method and of a method that hands out an object, with the
# resident memory and the object commands counted before and after: both must stay flat.
# In icount, the script runs under callgrind (--collect-atstart=no, --callgrind-out-file=DUMPS) and
# counts the instructions of N and of 2N calls of each case, less those of the empty loop; each
# row is set against its goal. There the baselines and the tool are counted before the test kit is
# loaded, which watches every component of the process once it is.
#
#   tclsh8.6 bench.tcl -lib DIR -native FILE ?-swig FILE? ?-json FILE?
#                      ?-rounds N? ?-seconds S? ?-calls N?
#   valgrind --tool=callgrind --collect-atstart=no --callgrind-out-file=DUMPS \
#       tclsh8.6 bench.tcl -mode icount -dumps DUMPS -lib DIR -native FILE ?-swig FILE? ?-json FILE?
#                      ?-count N?
#
# -lib is the folder with pkgIndex.tcl, -native and -swig the baseline extensions, -seconds the
# time one case takes in one round, -calls the length of each memory run, -count the calls that
# callgrind counts. In time, exits 1 when memory or the command count grows; in icount, a missed
# goal is reported, not failed.

namespace eval bench {
    variable opt [dict create -mode time -lib {} -native {} -swig {} -json {} -rounds 7 -seconds 1.0 \
                      -calls 1000000 -count 1000 -dumps {}]
    variable here [file dirname [file normalize [info script]]]
    # Calls run in chunks of this many, so the kit's call records can be dropped between chunks.
    variable chunk 1000
    # The turns that the cases take within one round.
    variable slices 10
    # Growth of the resident set, in kB, that a memory run may show before it counts as a leak:
    # allocator slack, not a per-call loss, which at a million calls would be far larger.
    variable rssSlackKb 4096
    # Calls made before a case is counted, so that what only a first call does is left out.
    variable warmup 10
    # The dumps callgrind has written so far; they are numbered from 1.
    variable dumps 0
}

source [file join [file dirname [file normalize [info script]]] options.tcl]

proc bench::Options {argv} {
    variable opt
    benchOptions opt $argv "bench.tcl ?-mode time|icount? -lib DIR -native FILE ?-swig FILE? ?-json FILE? ?-rounds N? ?-seconds S? ?-calls N? ?-count N? ?-dumps FILE?"
    set needed {-lib -native}
    switch -- [dict get $opt -mode] {
        time {}
        icount {lappend needed -dumps}
        default {error "bad mode \"[dict get $opt -mode]\": must be time or icount"}
    }
    foreach name $needed {
        if {[dict get $opt $name] eq {}} {error "missing $name"}
    }
}

# A case: its key, its name, the command as a script writes it, and as options the kit object
# whose records are dropped after each chunk (-kit, none for the baselines and the tool, which
# keep none) and the goal of its count of instructions per call (-goal: a number, or the key of
# the case it must not exceed).
proc bench::Case {key name command args} {
    variable cases
    set case [dict create name $name command $command kit {} goal {}]
    foreach {option value} $args {
        if {$option ni {-kit -goal}} {
            error "unknown case option \"$option\": must be -kit or -goal"
        }
        dict set case [string range $option 1 end] $value
    }
    dict set cases $key $case
    MakeLoop $key $command [dict get $case kit]
}

# The baselines and the tool, and every case; the kit's objects come later, in SetupKit.
proc bench::Setup {} {
    variable opt
    variable here
    lappend ::auto_path [dict get $opt -lib]
    package require KelmarTool
    source [file join $here plain.tcl]
    load [dict get $opt -native] Benchnative
    if {[dict get $opt -swig] ne {}} {
        load [dict get $opt -swig] Benchsink
    }

    set ::native benchnative
    set ::plain [PlainCollection new]
    set ::plainview [PlainView new]
    # The tool's root commands, with the sample design open and a collection x of its registers.
    kelmartool::open [file join [file dirname $here] examples designs counter.json]
    set ::tcoll ::kelmartool::collection
    set ::tview ::kelmartool::view
    $::tcoll set x {r0 r1}

    Case native "native limit" {$native x}
    if {[dict get $opt -swig] ne {}} {
        set ::sink [benchsink::new_Sink]
        Case swig "SWIG binding" {$sink Take x}
    }
    Case plainequal "plain Tcl (TclOO)" {$plain equal a b -order}
    Case plainzoom "plain Tcl (TclOO), eleven options" {$plainview zoom -in -name n}
    Case loop "loop alone (in every row)" {}
    Case close "plain method" {$project Close} -kit project -goal 2400
    Case sync "plain method with OUT variable" {$project Sync msg} -kit project
    Case get "matched, no options" {$coll get x} -kit coll -goal 5000
    Case equal "matched, one bool option given" {$coll equal a b -order} -kit coll -goal 9879
    Case add "matched, tail of 8" {$sel add a b c d e f g h} -kit sel -goal 14000
    Case search "matched, list options" {$search search x -type a -type b -in c} -kit search -goal 24000
    Case zoom "switch, eleven options" {$view zoom -in -name n} -kit view -goal 17044
    Case hl "default that runs a command" {$hl add a} -kit hl -goal 12000
    Case toolequal "tool: matched, one bool option" {$tcoll equal x x -order} -goal 10000
    Case toolzoom "tool: switch, eleven options" {$tview zoom -in -name r0} -goal 34000
}

# The test kit and its objects. Once loaded, the kit watches the end of every component in the
# process, the tool's too, which costs the tool's calls something of their own.
proc bench::SetupKit {} {
    package require TcltaskI_TestKit
    set ::project [testkit::new ITclProject]
    set ::coll [testkit::new ICollection]
    set ::sel [testkit::new ISelection]
    set ::search [testkit::new ISearch]
    set ::view [testkit::new IGraphicalView]
    set ::hl [testkit::new IHighlight]
    # The default colour of the highlight's add asks this command on every call.
    proc ::highlight {args} {return red}
}

# Forgets what the kit keeps of the calls: the records of one kit object, if the case has one, and
# every component's end, once the kit is loaded. Left alone they would fill memory and slow the
# calls that follow.
proc bench::Drop {kit} {
    if {$kit ne {}} {
        testkit::reset [set ::$kit]
    }
    if {[llength [info commands ::testkit::events]]} {
        testkit::events
    }
    return
}

# The loops of one case, as compiled procs. calls_KEY makes n calls; the object words are copied
# into locals first, so its body is what a script's own loop would run. loop_KEY makes chunks of
# calls, with the kit's records dropped after each chunk, and gives the microseconds of the calls.
proc bench::MakeLoop {key command kit} {
    variable chunk
    set locals {}
    foreach {- var} [regexp -all -inline {\$(\w+)} $command] {
        append locals "set $var \$::$var\n"
    }
    proc ::bench::calls_$key {n} [string map [list @LOCALS@ $locals @COMMAND@ $command] {
        @LOCALS@
        for {set i 0} {$i < $n} {incr i} {
            @COMMAND@
        }
    }]
    proc ::bench::loop_$key {chunks} [string map [list @KEY@ $key @KIT@ [list $kit] @CHUNK@ $chunk] {
        set used 0
        for {set c 0} {$c < $chunks} {incr c} {
            set start [clock microseconds]
            ::bench::calls_@KEY@ @CHUNK@
            incr used [expr {[clock microseconds] - $start}]
            ::bench::Drop @KIT@
        }
        return $used
    }]
}

# Microseconds that the calls of the loop take for so many chunks: the drop of the kit's records
# between chunks is the bench's own work and is not timed, as it is not counted in icount.
proc bench::Time {loop chunks} {
    return [$loop $chunks]
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

# The instructions that callgrind counts in n calls of a case, the loop included. The window opens
# and closes around the loop alone; the kit's records are dropped on either side of it.
proc bench::CountCase {key n} {
    variable opt
    variable cases
    variable dumps
    set kit [dict get $cases $key kit]
    Drop $kit
    benchcount start
    ::bench::calls_$key $n
    benchcount stop $key/$n
    Drop $kit
    # Callgrind numbers the dumps of a run from 1, after the name it was given.
    set file [dict get $opt -dumps].[incr dumps]
    set f [open $file]
    set dump [read $f]
    close $f
    file delete $file
    if {![regexp -line {^totals:\s+(\d+)} $dump -> total]} {
        error "no totals in $file"
    }
    return $total
}

# Every case counted at N and at 2N calls, less the empty loop of as many calls: a figure per call
# that stays put when N doubles (difference, in percent) is free of what the window itself costs
# and of the kit's records. The cases without a kit object are counted first, before the kit is
# loaded: the tool's calls as a script in the tool makes them.
proc bench::Count {} {
    variable opt
    variable cases
    variable warmup
    set n [dict get $opt -count]
    set sizes [list $n [expr {2 * $n}]]
    ::bench::calls_loop $warmup
    set empty [lmap calls $sizes {CountCase loop $calls}]
    foreach phase {alone kit} {
        if {$phase eq "kit"} {
            SetupKit
        }
        dict for {key case} $cases {
            if {$key eq "loop" || ([dict get $case kit] eq {} ? "alone" : "kit") ne $phase} continue
            ::bench::calls_$key $warmup
            foreach calls $sizes base $empty label {n 2n} {
                set total [CountCase $key $calls]
                dict set cases $key total_$label $total
                dict set cases $key per_call_$label [expr {($total - $base) / double($calls)}]
            }
            puts stderr "counted $key"
        }
    }
    # The empty loop's own row shows what is taken from every other row.
    foreach calls $sizes base $empty label {n 2n} {
        dict set cases loop total_$label $base
        dict set cases loop per_call_$label [expr {$base / double($calls)}]
    }
    dict for {key case} $cases {
        dict set cases $key difference \
            [expr {abs([dict get $case per_call_2n] / [dict get $case per_call_n] - 1) * 100}]
    }
}

# Each case with a goal against it: the goal is a number, or the count of another case.
proc bench::Goals {} {
    variable cases
    dict for {key case} $cases {
        set goal [dict get $case goal]
        if {$goal eq {}} {
            dict set cases $key met {}
            continue
        }
        if {![string is integer -strict $goal]} {
            set goal [dict get $cases $goal per_call_n]
        }
        dict set cases $key goal_count $goal
        dict set cases $key met [expr {[dict get $case per_call_n] <= $goal}]
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
    MakeLoop mem_$key $command $kit
    set chunks [expr {max(1, [dict get $opt -calls] / $chunk)}]
    ::bench::loop_mem_$key [expr {max(1, $chunks / 100)}]
    set rssBefore [Rss]
    set cmdsBefore [Commands]
    ::bench::loop_mem_$key $chunks
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
    set format "%-36s %-40s %10s %9s %12s"
    puts [format $format case command ns/call "x native" calls/round]
    puts [string repeat - 111]
    dict for {key case} $cases {
        dict with case {
            puts [format $format $name $command [format %.1f $ns] [format %.2f $ratio] $calls]
        }
    }
    puts ""
    set format "%-36s %10s %10s %10s %10s %10s  %s"
    puts [format $format "memory run" calls "RSS kB" after commands after ""]
    puts [string repeat - 111]
    foreach run $memory {
        dict with run {
            puts [format $format $command $calls $rss_kb_before $rss_kb_after $commands_before \
                      $commands_after [expr {$ok ? "flat" : "GROWS"}]]
        }
    }
}

# The table of counts: per call at N and at 2N, and the goal with whether it is met.
proc bench::ReportCounts {} {
    variable opt
    variable cases
    set n [dict get $opt -count]
    set format "%-36s %-40s %12s %12s %24s %4s"
    puts [format $format case command "instr/call" "at 2N" goal met]
    puts [string repeat - 133]
    dict for {key case} $cases {
        dict with case {
            set shown {}
            if {$goal ne {}} {
                set shown "<= [format %.0f $goal_count]"
                if {![string is integer -strict $goal]} {
                    append shown " ($goal)"
                }
            }
            puts [format $format $name $command [format %.0f $per_call_n] [format %.0f $per_call_2n] \
                      $shown [expr {$met eq {} ? {} : $met ? {yes} : {NO}}]]
        }
    }
    lassign [lindex [lsort -real -decreasing -index 0 [lmap {key case} $cases {
        list [dict get $case difference] $key
    }]] 0] most where
    puts "\ninstructions per call, counted by callgrind over N = $n calls and again over 2N, less the\
          empty loop of as many calls; the two differ by [format %.2f $most]% at most ($where)"
}

proc bench::JsonString {text} {
    return "\"[string map {\\ \\\\ \" \\\" \n \\n \t \\t} $text]\""
}

# Writes a JSON object: the members are pairs of a name and a value already in JSON; a list of
# rows is written as an array, one row a line.
proc bench::JsonFile {file members} {
    set lines {}
    foreach {name value} $members {
        lappend lines "  [JsonString $name]: $value"
    }
    set f [open $file w]
    puts $f "\{\n[join $lines ",\n"]\n\}"
    close $f
}

proc bench::JsonArray {rows} {
    return "\[\n    [join $rows ",\n    "]\n  \]"
}

proc bench::Json {file} {
    variable opt
    variable cases
    variable memory
    set rows {}
    dict for {key case} $cases {
        dict with case {
            lappend rows [format {{"key": %s, "case": %s, "command": %s, "ns_per_call": %.2f, "ratio_to_native": %.3f, "calls_per_round": %d, "rounds_ns": [%s]}} \
                              [JsonString $key] [JsonString $name] [JsonString $command] $ns $ratio $calls \
                              [join [lmap v $rounds {format %.2f $v}] {, }]]
        }
    }
    set runs {}
    foreach run $memory {
        dict with run {
            lappend runs [format {{"command": %s, "calls": %d, "rss_kb_before": %d, "rss_kb_after": %d, "commands_before": %d, "commands_after": %d, "flat": %s}} \
                              [JsonString $command] $calls $rss_kb_before $rss_kb_after \
                              $commands_before $commands_after [expr {$ok ? "true" : "false"}]]
        }
    }
    JsonFile $file [list \
        rounds [dict get $opt -rounds] \
        seconds_per_round [dict get $opt -seconds] \
        statistic [JsonString "median over rounds; ratio is the median of per-round ratios to native"] \
        cases [JsonArray $rows] \
        memory [JsonArray $runs]]
}

proc bench::JsonCounts {file} {
    variable opt
    variable cases
    set rows {}
    dict for {key case} $cases {
        dict with case {
            set goalJson null
            set goalRow null
            set metJson null
            if {$goal ne {}} {
                set goalJson [format %.0f $goal_count]
                if {![string is integer -strict $goal]} {
                    set goalRow [JsonString $goal]
                }
                set metJson [expr {$met ? "true" : "false"}]
            }
            lappend rows [format {{"key": %s, "case": %s, "command": %s, "instructions_per_call": %.1f, "instructions_per_call_2n": %.1f, "difference_percent": %.2f, "total_n": %s, "total_2n": %s, "goal": %s, "goal_row": %s, "met": %s}} \
                              [JsonString $key] [JsonString $name] [JsonString $command] \
                              $per_call_n $per_call_2n $difference $total_n $total_2n $goalJson $goalRow $metJson]
        }
    }
    JsonFile $file [list \
        calls [dict get $opt -count] \
        statistic [JsonString "instructions per call counted by callgrind over N and 2N calls,\
                                less the empty loop of as many calls"] \
        cases [JsonArray $rows]]
}

proc bench::Main {argv} {
    variable opt
    variable memory
    Options $argv
    Setup
    set json [dict get $opt -json]
    if {[dict get $opt -mode] eq "icount"} {
        Count
        Goals
        ReportCounts
        if {$json ne {}} {
            JsonCounts $json
            puts "\nwritten: $json"
        }
        return
    }
    SetupKit
    Measure
    Memory
    Report
    if {$json ne {}} {
        Json $json
        puts "\nwritten: $json"
    }
    foreach run $memory {
        if {![dict get $run ok]} {
            puts stderr "memory or object commands grow under [dict get $run command]"
            exit 1
        }
    }
}

bench::Main $argv
