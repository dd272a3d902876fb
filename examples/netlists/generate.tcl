# Writes a synthetic design of any size as a JSON netlist in the form `write_json` gives after
# `synth -lut 4`: four-input `$lut` cells and `$_DFF_P_` flip-flops. Synthesis of a design of tens
# of thousands of cells takes long; this writes one in seconds, to measure the tool at scale.
#
#   tclsh8.6 examples/netlists/generate.tcl CELLS FILE ?-seed N? ?-ports N? ?-top NAME?
#
# The cells come in clusters of eight LUTs and four flip-flops, the stages of parallel pipelines
# (lanes): cluster k is stage k / lanes of lane k % lanes. A LUT takes its inputs from the LUTs just
# before it in its cluster and from the flip-flops of its cluster or of the stage before, in its
# lane or the next ones; a few inputs come from a flip-flop anywhere (long nets) or from the input
# `en` (a net of high fanout). Every flip-flop is clocked by `clk` and samples a LUT of its cluster.
# The first stage reads the inputs `in`, the last flip-flops drive the outputs `out`. A LUT feeds
# only later LUTs, so that no combinational loop forms. The same seed gives the same file.

proc usage {} {
    puts stderr "usage: generate.tcl CELLS FILE ?-seed N? ?-ports N? ?-top NAME?"
    exit 2
}

proc main {argv} {
    if {[llength $argv] < 2 || [llength $argv] % 2} usage
    lassign $argv cells file
    set options [dict create -seed 1 -ports {} -top top]
    foreach {name value} [lrange $argv 2 end] {
        if {![dict exists $options $name]} usage
        dict set options $name $value
    }
    if {![string is integer -strict $cells] || $cells < 1} usage
    set seed [dict get $options -seed]
    if {![string is integer -strict $seed] || $seed < 0} usage
    set ports [dict get $options -ports]
    if {$ports ne {} && (![string is integer -strict $ports] || $ports < 1)} usage
    set f [open $file w]
    try {
        write $f $cells $seed $ports [dict get $options -top]
    } finally {
        close $f
    }
}

# Cell i is a LUT at positions 0-7 of its cluster, a flip-flop at 8-11; its output is bit
# $base + i. Bits 2 and 3 are clk and en, then come the inputs.
proc write {f cells seed ports top} {
    expr {srand($seed)}
    set clusters [expr {($cells + 11) / 12}]
    set lanes [expr {max(1, int(ceil(sqrt($clusters))))}]
    set flops [expr {$cells / 12 * 4 + max(0, $cells % 12 - 8)}]
    if {$ports eq {}} { set ports [expr {max(2, min(256, round(sqrt($cells) / 4)))}] }
    set outs [expr {min($ports, max(1, $flops))}]
    set clk 2
    set en 3
    set base [expr {4 + $ports}]

    # The flip-flops of a cluster, none when it has none or lies outside the design.
    proc flopsOf {k} [string map [list @CELLS@ $cells] {
        set out {}
        for {set i [expr {12 * $k + 8}]} {$i < 12 * $k + 12 && $i < @CELLS@ && $k >= 0} {incr i} { lappend out $i }
        return $out
    }]
    proc pick {items} { lindex $items [expr {int(rand() * [llength $items])}] }

    puts $f "\{\n  \"creator\": \"examples/netlists/generate.tcl $cells -seed $seed\",\n  \"modules\": \{"
    puts $f "    [json $top]: \{\n      \"attributes\": \{ \"top\": \"00000000000000000000000000000001\" \},"
    puts $f "      \"ports\": \{"
    set lines [list "        \"clk\": \{ \"direction\": \"input\", \"bits\": \[ $clk \] \}" \
                    "        \"en\": \{ \"direction\": \"input\", \"bits\": \[ $en \] \}"]
    set inBits {}
    for {set j 0} {$j < $ports} {incr j} { lappend inBits [expr {4 + $j}] }
    lappend lines "        \"in\": \{ \"direction\": \"input\", \"bits\": \[ [join $inBits {, }] \] \}"
    # The outputs: the last flip-flops, or the last cells of a design without one.
    set outBits {}
    for {set i [expr {$cells - 1}]} {$i >= 0 && [llength $outBits] < $outs} {incr i -1} {
        if {$flops == 0 || $i % 12 >= 8} { lappend outBits [expr {$base + $i}] }
    }
    lappend lines "        \"out\": \{ \"direction\": \"output\", \"bits\": \[ [join $outBits {, }] \] \}"
    puts $f "[join $lines ",\n"]\n      \},\n      \"cells\": \{"

    set first 1
    for {set i 0} {$i < $cells} {incr i} {
        set k [expr {$i / 12}]
        set p [expr {$i % 12}]
        set lane [expr {$k % $lanes}]
        set own [flopsOf $k]
        # The flip-flops of the stage before, in this lane and the next one, or the inputs.
        if {$k < $lanes} {
            set before $inBits
        } else {
            set before {}
            foreach next {0 1} {
                set from [expr {$k - $lanes + ($lane + $next < $lanes ? $next : 0)}]
                foreach q [flopsOf $from] { lappend before [expr {$base + $q}] }
            }
        }
        if {$p < 8} {
            # Four different inputs, fewer in a design too small to offer them.
            set inputs {}
            for {set try 0} {[llength $inputs] < 4 && $try < 64} {incr try} {
                set r [expr {rand()}]
                if {$r < 0.01} {
                    set bit $en
                } elseif {$r < 0.03} {
                    set far [flopsOf [expr {int(rand() * $clusters)}]]
                    set bit [expr {[llength $far] ? $base + [pick $far] : [pick $inBits]}]
                } elseif {$r < 0.45 && $p > 0} {
                    set bit [expr {$base + $i - 1 - int(rand() * min($p, 3))}]
                } elseif {$r < 0.7 && [llength $own]} {
                    set bit [expr {$base + [pick $own]}]
                } else {
                    set bit [pick $before]
                }
                if {$bit ni $inputs} { lappend inputs $bit }
            }
            set width [llength $inputs]
            set table {}
            for {set b 0} {$b < 1 << $width} {incr b} { append table [expr {rand() < 0.5}] }
            set text "        \"lut$i\": \{\n          \"hide_name\": 0,\n          \"type\": \"\$lut\",\n\
                \         \"parameters\": \{ \"LUT\": \"$table\", \"WIDTH\": \"[format %032b $width]\" \},\n\
                \         \"attributes\": \{ \},\n\
                \         \"port_directions\": \{ \"A\": \"input\", \"Y\": \"output\" \},\n\
                \         \"connections\": \{ \"A\": \[ [join $inputs {, }] \], \"Y\": \[ [expr {$base + $i}] \] \}\n        \}"
        } else {
            set d [expr {$base + 12 * $k + 4 + int(rand() * 4)}]
            set text "        \"ff$i\": \{\n          \"hide_name\": 0,\n          \"type\": \"\$_DFF_P_\",\n\
                \         \"parameters\": \{ \},\n          \"attributes\": \{ \},\n\
                \         \"port_directions\": \{ \"C\": \"input\", \"D\": \"input\", \"Q\": \"output\" \},\n\
                \         \"connections\": \{ \"C\": \[ $clk \], \"D\": \[ $d \], \"Q\": \[ [expr {$base + $i}] \] \}\n        \}"
        }
        puts -nonewline $f [expr {$first ? "" : ",\n"}]$text
        set first 0
    }

    puts $f "\n      \},\n      \"netnames\": \{"
    set lines [list "        \"clk\": \{ \"hide_name\": 0, \"bits\": \[ $clk \] \}" \
                    "        \"en\": \{ \"hide_name\": 0, \"bits\": \[ $en \] \}" \
                    "        \"in\": \{ \"hide_name\": 0, \"bits\": \[ [join $inBits {, }] \] \}" \
                    "        \"out\": \{ \"hide_name\": 0, \"bits\": \[ [join $outBits {, }] \] \}"]
    puts -nonewline $f [join $lines ",\n"]
    for {set i 0} {$i < $cells} {incr i} {
        set name [expr {$i % 12 < 8 ? "\$abc\$n$i" : "q$i"}]
        puts -nonewline $f ",\n        \"$name\": \{ \"hide_name\": [expr {$i % 12 < 8}], \"bits\": \[ [expr {$base + $i}] \] \}"
    }
    puts $f "\n      \}\n    \}\n  \}\n\}"
}

proc json {text} { return "\"[string map {\\ \\\\ \" \\\"} $text]\"" }

main $argv
