# Runs one test file and exits non-zero when any of its tests failed.
#   tclsh run.tcl FILE.test
package require tcltest 2.5
lappend auto_path $::env(KELMAR_LIB)
set ::kelmarFailed 0
proc tcltest::cleanupTestsHook {} {
    if {$::tcltest::numTests(Failed) > 0} { set ::kelmarFailed 1 }
    if {$::tcltest::numTests(Total) == 0} { set ::kelmarFailed 1 }
    # With Tk loaded, cleanupTests itself ends the process after this hook, with status 0.
    if {![catch {package present Tk}]} { exit $::kelmarFailed }
}
tcltest::configure -verbose e
set file [lindex $argv 0]
set argv {}
source [file join [file dirname [info script]] common.tcl]
source $file
exit $::kelmarFailed
