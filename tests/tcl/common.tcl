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

# {code result} of a script run in the caller's frame.
proc ran {script} { lrange [uplevel 1 [list outcome $script]] 0 1 }

# Runs a script in the caller's frame, then deletes the object commands it made, and gives what is
# still alive beyond what was before, as {kind change ...} for each count of `testkit::live` that
# moved: empty when the script and its wrappers left nothing behind. A script that fails gives
# {error message} besides.
proc leftAlive {script} {
    set before [testkit::live]
    set words [info commands ::kelmar::*]
    set failed [catch {uplevel 1 $script} message]
    foreach word [info commands ::kelmar::*] {
        if {$word ni $words} { rename $word {} }
    }
    set moved {}
    dict for {kind count} [testkit::live] {
        set change [expr {$count - [dict get $before $kind]}]
        if {$change != 0} { lappend moved $kind $change }
    }
    if {$failed} { lappend moved error $message }
    return $moved
}

# Runs a script in the caller's frame with a fault of the kit switched on, off again on every way out.
proc underFault {fault script} {
    testkit::fault $fault on
    try { uplevel 1 $script } finally { testkit::fault $fault off }
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

# A kit handler by which every operation answers what the global variable `name` holds at the time
# of the call; the word -error makes the handler fail, so that the kit's operation throws.
proc answerFrom {name} { list ::kitAnswerFrom $name }
proc kitAnswerFrom {name op args} {
    set answer [set ::$name]
    if {$answer eq "-error"} { error "$op refused by the test" }
    return $answer
}

# The identifier variable of a task interface, e.g. ifaceId ICollection.
proc ifaceId {iface} { set ::kelmar::TcltaskI::${iface}ID }

# The nine classes whose commands run the matched or switch frame. kitObjects makes, in the
# caller, obj($class) answering what ::reply holds and with help "usage: %W", and orphan($class)
# without an object.
set optionClasses {ICollection IGlobal IObject IGraphicalView IHighlight ISelection ISearch ITimingAnalysis IXFloorplan}
set reply {}
proc kitObjects {} {
    upvar 1 obj obj orphan orphan
    foreach class $::optionClasses {
        set obj($class) [testkit::new $class -handler [answerFrom reply] -help "usage: %W"]
        set orphan($class) [testkit::orphan $class]
    }
}

# The calls that `$word args...` made of its kit object, after forgetting the earlier ones; when the
# command fails, {error TEXT} followed by the calls it made all the same.
proc callsOf {word args} {
    testkit::reset $word
    if {[catch {$word {*}$args} text]} { return [list error $text {*}[testkit::calls $word]] }
    testkit::calls $word
}

# One test of callsOf per row {class words expected} of `rows`, on the caller's obj($class), named
# id.1, id.2...; `expected` is substituted in the caller, so that it can use the texts below.
proc callsTable {id rows} {
    upvar 1 obj obj
    set n 0
    foreach {class words expected} $rows {
        test $id.[incr n] "$class $words" -body [list callsOf $obj($class) {*}$words] \
            -result [uplevel 1 [list subst $expected]]
    }
}

# The package's own texts of the option passes and the frames; the procs give a failing row's
# {error TEXT}, with the help of the kit objects ("usage: %W") where the package adds it.
set wrongCountText "Wrong number of required arguments specified."
set loaderText "Error loading command argument matcher component library or while creating the command matcher component."
set ambiguousText "Ambiguous optional argument 'errors\n"
proc noMatchText {typed args} {
    set text "Optional argument '$typed' does not match with any of valid optional arguments.\nPlease specify one of the following options\n"
    foreach name $args { append text "   -$name\n" }
    return $text
}
proc defaultFailureText {name type} {
    return "\nFailure(s) took place while retrieving the default value for \noptional argument '$name' of type '$type'"
}
proc expectsValueText {name type} { return "\nOptional argument '$name' of type '$type' expects a value" }
proc notASwitchText {word} { return "The current argument \"$word\" is not an optional argument switch as expected." }
proc unrecognizedText {name} { return "Unrecognized optional argument \"-$name\"" }
proc noObjectText {class word} { return "Failed to get pointer to wrapped object in TcltaskI::TclWrap${class}::kel_$word" }
proc exceptionText {class word} { return "An exception took place while calling TcltaskI::TclWrap${class}::kel_$word" }
proc tooFewText {object word} {
    set name [regsub {^::kelmar::} $object {}]
    return "Wrong number of arguments: '$name $word'\nPlease type 'help $name $word' to get more information"
}
proc wrong {word} { list error "$::wrongCountText\nusage: $word" }
proc noMatch {typed args} { list error [noMatchText $typed {*}$args] }
proc ambiguous {} { list error $::ambiguousText }
proc expects {name type} { list error [expectsValueText $name $type] }
proc notASwitch {word help} { list error "[notASwitchText $word]\nusage: $help" }
proc unrecognized {name help} { list error "[unrecognizedText $name]\nusage: $help" }
