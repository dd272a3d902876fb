# Runs seeded random command lines against the package, the test kit and the tool.
#
#   ktclsh fuzz.tcl ?-seed N? ?-lines N? ?-without CLASSES? ?-log FILE?
#
# KELMAR_LIB names the folder of the libraries; the working directory must be a fresh temporary
# folder, as the lines write files into it (tests/fuzz/run.sh makes one). The lines run in an
# interpreter of their own, the arena, deleted at the end, so that whatever they made must be gone
# then: LeakSanitizer sees it at exit, and the kit's counts are checked here. -without leaves
# classes of lines out (see fz::classes in lines.tcl), to explore the others past a known fault.
# -log writes every line before it runs. The last line of the output is "lines N" when nothing
# failed.

set options [dict merge {-seed 1 -lines 1000 -without {} -log {}} $argv]
set here [file dirname [file normalize [info script]]]
set samples [glob [file join $here .. .. examples designs *.json]]

set arena [interp create]
$arena eval [list lappend ::auto_path $env(KELMAR_LIB)]
$arena eval [list source [file join $here lines.tcl]]
set ran [$arena eval [list fz::run [dict get $options -seed] [dict get $options -lines] \
    [dict get $options -without] $samples [dict get $options -log]]]
set without [dict get $options -without]
if {"teardown" ni $without} { interp delete $arena }

# The kit's helpers and the holders behind its orphans live for the process by design: with all of
# them made here, nothing else may be left. Loading the kit here loads the package once more, as
# lines of the class child do; without them, the count goes with the load.
if {"teardown" ni $without && "child" ni $without} {
    lappend auto_path $env(KELMAR_LIB)
    package require TcltaskI_TestKit
    set helpers {hh gg nosuch}
    set classes {ITclProject ITclProjectMgr ICollection IGlobal IGraphicalView IHighlight IObject ISearch
                 ISelection ITimingAnalysis IXFloorplan}
    foreach name $helpers { testkit::helper $name }
    foreach class $classes { testkit::orphan $class }
    set live [testkit::live]
    if {$live ne [list property 0 matcher 0 namelist 0 object [expr {[llength $helpers] + [llength $classes]}]]} {
        puts "left alive after the arena was deleted: $live"
        exit 1
    }
}
puts "lines $ran"
