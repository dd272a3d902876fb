# Shared by the Tcl tests: loads the test kit and offers checks that every test file uses.
package require TcltaskI_TestKit
namespace import ::tcltest::*

# A test that pins a fault of the package runs only once the fault is mended.
testConstraint knownBug 0

# Runs a script in the caller's frame and gives {code result errorInfo}; errorInfo only for code 1.
proc outcome {script} {
    set code [catch {uplevel 1 $script} result options]
    list $code $result [expr {$code == 1 ? [dict get $options -errorinfo] : ""}]
}

# 1 when errorInfo begins with the text of the failure, as the package's reports put it there.
proc infoHolds {outcome} {
    lassign $outcome code result info
    expr {$code == 1 && [string first $result $info] == 0}
}

# Runs a script in the caller's frame, then deletes the object commands it made, and gives what is
# still alive beyond what was before, as {kind change ...} for each count of `testkit::live` that
# moved: empty when the script and its wrappers left nothing behind. Errors of the script are caught.
proc leftAlive {script} {
    set before [testkit::live]
    set words [info commands ::kelmar::*]
    catch {uplevel 1 $script}
    foreach word [info commands ::kelmar::*] {
        if {$word ni $words} { rename $word {} }
    }
    set moved {}
    dict for {kind count} [testkit::live] {
        set change [expr {$count - [dict get $before $kind]}]
        if {$change != 0} { lappend moved $kind $change }
    }
    return $moved
}

# A kit handler answering each operation by the dict given for it in `answers`, the others by {};
# the answer `-error` makes the handler fail, so that the kit's operation throws.
proc answerBy {answers} { list ::kitAnswer $answers }
proc kitAnswer {answers op args} {
    if {![dict exists $answers $op]} { return {} }
    set answer [dict get $answers $op]
    if {$answer eq "-error"} { error "$op refused by the test" }
    return $answer
}

# The identifier variable of a task interface, e.g. ifaceId ICollection.
proc ifaceId {iface} { set ::kelmar::TcltaskI::${iface}ID }
