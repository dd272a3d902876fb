# kelmartool::synth: Verilog to a placed, timed design in one command. Yosys (found on PATH)
# synthesizes the files into a netlist that stays beside the project file (alu.design.json and
# alu.netlist.json), so that the design names a netlist that exists; kelmartool::read_netlist
# imports it. A failure leaves both files as they were. The package index sources this file when it
# loads the tool.
#
#   kelmartool::synth FILE.v ?FILE.v ...? -top MODULE ?-flow lut4|ice40? ?read_netlist options?
#
# Refusals carry the codes of read_netlist's: {KELMAR TOOL VALUE} for a bad word,
# {KELMAR TOOL FILE FILE} for a file that cannot be read (the Verilog files, when yosys fails on
# them), and {KELMAR TOOL PROGRAM yosys} when there is no yosys to run.

namespace eval ::kelmartool::synthesis {
    # The yosys script of each flow, run after the files are read.
    variable flows {lut4 {synth -lut 4 -top %s} ice40 {synth_ice40 -top %s}}
    variable passed {-clock -device -utilization -seed -library -project}
    variable usage "kelmartool::synth file.v ?file.v ...? -top module ?-flow lut4|ice40? ?-clock net=period ...?\
?-device colsxrows? ?-utilization u? ?-seed n? ?-library file? ?-project file?"

    proc refuse {code text} { return -code error -level 2 -errorcode [list KELMAR TOOL {*}$code] $text }
}

proc ::kelmartool::synth {args} {
    namespace upvar synthesis flows flows passed passed usage usage
    set files {}
    while {[llength $args] > 0 && ![string match -* [lindex $args 0]]} {
        set args [lassign $args file]
        lappend files $file
    }
    if {[llength $files] == 0 || [llength $args] % 2 != 0} {
        return -code error -errorcode {TCL WRONGARGS} "wrong # args: should be \"$usage\""
    }
    set top ""
    set flow lut4
    set options {}
    foreach {option value} $args {
        if {$option eq "-top"} {
            # It goes into a yosys command line: a plain identifier only.
            if {![regexp {^[A-Za-z_][A-Za-z0-9_$]*$} $value]} {
                synthesis::refuse VALUE "-top wants a module name, not \"$value\""
            }
            set top $value
        } elseif {$option eq "-flow"} {
            if {![dict exists $flows $value]} { synthesis::refuse VALUE "-flow wants lut4 or ice40, not \"$value\"" }
            set flow $value
        } elseif {$option in $passed} {
            lappend options $option $value
        } else {
            synthesis::refuse VALUE "bad option \"$option\": must be -top, -flow, [join $passed {, }]"
        }
    }
    if {$top eq ""} { synthesis::refuse VALUE "kelmartool::synth wants -top MODULE" }
    foreach file $files {
        if {![file isfile $file] || ![file readable $file]} {
            synthesis::refuse [list FILE $file] "cannot read the Verilog file '$file': no such readable file"
        }
    }
    set yosys [auto_execok yosys]
    if {$yosys eq ""} { synthesis::refuse {PROGRAM yosys} "kelmartool::synth runs yosys, which is not on PATH" }
    if {![dict exists $options -project]} {
        dict set options -project [file rootname [lindex $files 0]].design.json
    }

    # The netlist is written to a temporary file beside its place and takes the place only once yosys
    # succeeded; the one it replaces is kept aside until the import succeeded too.
    set project [dict get $options -project]
    set netlist [regsub {(\.design)?\.json$} $project {}].netlist.json
    close [file tempfile fresh [file join [file dirname $project] kelmar_synth.json]]
    set aside ""
    set placed 0
    try {
        # Absolute names, so that no file is taken for an option; -f verilog, so that no name's
        # ending makes yosys run it as a script.
        set status [catch {
            exec -ignorestderr {*}$yosys -q -f verilog -p [format [dict get $flows $flow] $top] -o $fresh \
                {*}[lmap file $files { file normalize $file }] 2>@1
        } output]
        if {$status} {
            set lines [lmap line [split $output \n] {
                if {[string trim $line] eq "" || $line eq "child process exited abnormally"} continue
                set line
            }]
            synthesis::refuse [list FILE {*}$files] \
                "yosys could not synthesize [join $files {, }]:\n[join [lrange $lines end-4 end] \n]"
        }
        if {[file exists $netlist]} {
            close [file tempfile aside [file join [file dirname $project] kelmar_synth_old.json]]
            file rename -force $netlist $aside
        }
        file rename $fresh $netlist
        set fresh ""
        set placed 1
        set result [kelmartool::read_netlist $netlist {*}$options]
        set placed 0
        if {$aside ne ""} { file delete $aside }
        set aside ""
        return $result
    } finally {
        if {$fresh ne ""} { file delete $fresh }
        if {$placed} { file delete $netlist }
        if {$aside ne ""} { file rename -force $aside $netlist }
    }
}
