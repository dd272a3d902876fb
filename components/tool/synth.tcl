# kelmartool::synth: Verilog to a placed, timed design in one command. Yosys (found on PATH)
# synthesizes the files into a netlist in a temporary file, which kelmartool::read_netlist imports
# and which is removed afterwards. The package index sources this file when it loads the tool.
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

    close [file tempfile netlist kelmar_synth.json]
    try {
        # Absolute names, so that no file is taken for an option; -f verilog, so that no name's
        # ending makes yosys run it as a script.
        set status [catch {
            exec -ignorestderr {*}$yosys -q -f verilog -p [format [dict get $flows $flow] $top] -o $netlist \
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
        return [kelmartool::read_netlist $netlist {*}$options]
    } finally {
        file delete $netlist
    }
}
