# Synthesizes a Verilog design with yosys, imports and places it, and times it:
#   kelmarsh examples/verilog/import.tcl ?FILE.v? ?TOP? ?CLOCK? ?PERIOD? ?LIBRARY.json?
# (the ALU beside this script by default, its clock clk at 4 ns, the shipped delay library). The
# project file goes to a fresh folder under the temporary folder.
lassign $argv source top clock period library
set here [file dirname [file normalize [info script]]]
if {$source eq ""} { set source [file join $here alu.v] }
if {$top eq ""} { set top [file rootname [file tail $source]] }
if {$clock eq ""} { set clock clk }
if {$period eq ""} { set period 4 }

set folder [file join [expr {[info exists env(TMPDIR)] ? $env(TMPDIR) : "/tmp"}] kelmar-import-[pid]]
file mkdir $folder
set options [list -top $top -clock $clock=$period -project [file join $folder $top.design.json]]
if {$library ne ""} { lappend options -library $library }
puts "imported [file tail $source] into [kelmartool::synth $source {*}$options]"

set cells [search search * -type cell]
set flops [lmap c $cells { if {![obj get $c sequential]} continue; set c }]
set types {}
foreach c $cells { dict incr types [obj get $c cell_type] }
floorplan open
set device [floorplan properties]
floorplan close -nosave
puts "[llength $cells] cells ([llength $flops] flip-flops), [llength [search search * -type net]] nets,\
[llength [search search * -type port]] ports on a [dict get $device columns]x[dict get $device rows] device"
puts [kelmartool::report dict $types]

# The worst paths, each with its points; the slack is the clock's period less the setup of the
# flip-flop it ends at, less the arrival.
timing new worst
puts "\n[kelmartool::report paths [timing run worst]]"
puts "\nworst slack [timing get worst worst_slack] ns at $period ns"
