# Synthesizes a Verilog design with yosys, imports the netlist, places and times it:
#   kelmarsh examples/verilog/import.tcl ?FILE.v? ?TOP? ?CLOCK? ?PERIOD?
# (the counter beside this script by default). The netlist and the project file go to a fresh
# folder under the temporary folder.
lassign $argv source top clock period
set here [file dirname [file normalize [info script]]]
if {$source eq ""} { set source [file join $here counter.v]; set top counter }
if {$top eq ""} { set top [file rootname [file tail $source]] }
if {$clock eq ""} { set clock clk }
if {$period eq ""} { set period 5 }

set folder [file join [expr {[info exists env(TMPDIR)] ? $env(TMPDIR) : "/tmp"}] kelmar-import-[pid]]
file mkdir $folder
set netlist [file join $folder $top.json]
exec yosys -q -p "read_verilog $source; synth -lut 4 -top $top; write_json $netlist"

# The clock input gets its period; the nets on the flip-flops' clock pins become clocks anyway.
puts "imported into [kelmartool::read_netlist $netlist -clock $clock=$period]"

set cells [search search * -type cell]
set flops [lmap c $cells { if {![obj get $c sequential]} continue; set c }]
puts "[llength $cells] cells ([llength $flops] flip-flops), [llength [search search * -type net]] nets,\
[llength [search search * -type port]] ports"

timing new run
set paths [timing run run]
puts "worst slack [timing get run worst_slack] ns over [llength $paths] paths"
foreach path [lrange [lsort -real -index 1 [lmap p $paths { list $p [dict get $p slack] }]] 0 2] {
    set p [lindex $path 0]
    puts "  [dict get $p startpoint] -> [dict get $p endpoint]: slack [dict get $p slack]"
}
