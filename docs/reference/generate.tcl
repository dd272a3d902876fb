# Writes the command reference, docs/commands.md, from what the code says and from what was written
# by hand, so that the reference cannot drift from the code:
#
#   - the command tables (wrappers/*/*.cpp): every command word in table order, its word count, its
#     options and the texts of their defaults;
#   - the package itself, loaded with the test kit, which must do what was read from the tables: the
#     same words in the same order, the same counts, option names and defaults; it also tells which
#     options take a value and which are booleans;
#   - the reference tool's help: the synopsis, what a command does and what it returns; its
#     positionals and options must be those of the table;
#   - docs/reference/entries.tcl: how each command fails and one example, which run in kelmarsh on a
#     copy of examples/designs/counter.json and are shown with what they printed.
#
#   tclsh8.6 docs/reference/generate.tcl LIBDIR OUT ?SCRATCH?
#
# LIBDIR is the build's lib folder (build/lib), OUT the file to write, SCRATCH the folder the
# examples run in (LIBDIR/../reference-scratch by default, removed afterwards). Every problem found
# is printed and the exit code is 1; OUT is then left as it was.

namespace eval reference {
    variable here [file dirname [file normalize [info script]]]
    variable top [file dirname [file dirname $here]]
}

# --- The command tables ---------------------------------------------------------------------------

# The text of a C++ string literal's body.
proc reference::unquote {literal} {
    return [string map {\\\" \" \\\\ \\} $literal]
}

# A dict of wrapper class -> rows in table order, each row a dict of word, kind (Plain, Matched,
# Switch), count and options (a list of {name default}), read from the declarations of
# wrappers/*/*.cpp. A row that is no declaration of the known form is a problem of the caller's list.
proc reference::readTables {top problemsVar} {
    upvar 1 $problemsVar problems
    set option {Option\{"(\w+)",\s*"((?:[^"\\]|\\.)*)"\}}
    set anyOption {Option\{"\w+",\s*"(?:[^"\\]|\\.)*"\}}
    set tables {}
    foreach file [lsort [glob -directory [file join $top wrappers] */*.cpp]] {
        set fd [open $file]
        set text [read $fd]
        close $fd
        if {![regexp {using W = (TclWrap\w+);} $text -> class]} continue
        if {![regexp {W::Rows<([^>]*)>} $text -> order]} {
            lappend problems [list table $class "no row list W::Rows<...> in $file"]
            continue
        }
        set named {}
        foreach line [regexp -all -inline -line {^constexpr Option .*$} $text] {
            foreach {-> var name default} [regexp -all -inline "(\\w+)[string range $option 6 end]" $line] {
                dict set named $var [list $name [unquote $default]]
            }
        }
        set decls {}
        set declaration "constexpr auto (\\w+) = (Plain|Matched|Switch)\\(\"(\[^\"\]*)\",\\s*(\\d+),\\s*\"\[^\"\]*\",\\s*&I::\\w+((?:,\\s*(?:$anyOption|\\w+))*)\\);"
        foreach {-> var kind word count tail} [regexp -all -inline $declaration $text] {
            set options {}
            foreach item [regexp -all -inline "$anyOption|\\w+" $tail] {
                if {[regexp "^$option\$" $item -> name default]} {
                    lappend options [list $name [unquote $default]]
                } else {
                    lappend options [dict get $named $item]
                }
            }
            dict set decls $var [dict create word $word kind $kind count $count options $options]
        }
        set rows {}
        foreach var [split [string map {, " "} $order]] {
            if {$var eq ""} continue
            if {![dict exists $decls $var]} {
                lappend problems [list table $class "the row $var is no declaration of the form Plain|Matched|Switch(\"word\", count, \"signature\", &I::op, options...)"]
                continue
            }
            lappend rows [dict get $decls $var]
        }
        dict set tables $class $rows
    }
    return $tables
}

# --- What the package does ------------------------------------------------------------------------

# The command words an object's unknown-command message lists.
proc reference::wordsOf {interp object} {
    catch {$interp eval [list $object __no_such_word__]} message
    set words {}
    foreach line [lrange [split $message \n] 2 end] {
        if {[string trim $line] ne ""} { lappend words [string trim $line] }
    }
    return $words
}

# Checks the rows of every table against a test-kit object of its interface and adds to each option
# its kind (bool or value) and whether a value given again is kept beside the first (repeat).
# Problems go to the caller's list.
proc reference::probe {interp tables problemsVar} {
    upvar 1 $problemsVar problems
    $interp eval {
        package require TcltaskI_TestKit
        namespace import ::kelmartool::highlight
    }
    dict for {class rows} $tables {
        set iface [string range $class 7 end]
        set object [$interp eval [list testkit::new $iface]]
        set words [lmap row $rows {dict get $row word}]
        if {[wordsOf $interp $object] ne [list {*}$words GetInterface]} {
            lappend problems [list table $class "the package's words are [wordsOf $interp $object], the table's $words"]
        }
        set checked {}
        foreach row $rows {
            dict with row {}
            set where "$class $word"
            set dummies [lrepeat $count 0]
            if {[catch {$interp eval [list $object $word {*}$dummies]} message]} {
                lappend problems [list table $where "$count words are refused: $message"]
                dict set row tail 0
                dict set row options [lmap o $options {list {*}$o value 0}]
                lappend checked $row
                continue
            }
            if {$count > 0 && ![catch {$interp eval [list $object $word {*}[lrange $dummies 1 end]]}]} {
                lappend problems [list table $where "[expr {$count - 1}] words are taken, the table says $count"]
            }
            set tail [expr {$count > 0 && ![catch {$interp eval [list $object $word {*}$dummies 0]}]}]
            set ns ::TcltaskI::${class}::$word
            set wrap [expr {$kind eq "Matched" ? "__" : ""}]
            set names [lmap var [$interp eval [list info vars ${ns}::*]] {
                string range [namespace tail $var] [string length $wrap] end-[string length $wrap]
            }]
            if {[lsort $names] ne [lsort [lmap o $options {lindex $o 0}]]} {
                lappend problems [list table $where "the package sets the options [lsort $names], the table declares $options"]
            }
            set described {}
            foreach o $options {
                lassign $o name default
                set var ${ns}::$wrap$name$wrap
                $interp eval [list $object $word {*}$dummies]
                set expected [$interp eval [list namespace eval $ns "set ::reference_default $default"]]
                if {[$interp eval [list info exists $var]] && [set actual [$interp eval [list set $var]]] ne $expected} {
                    lappend problems [list table $where "-$name: the default text $default gives '$expected', the package set '$actual'"]
                }
                if {![catch {$interp eval [list $object $word {*}$dummies -$name]}]} {
                    set type bool
                    set repeat 0
                } elseif {[catch {$interp eval [list $object $word {*}$dummies -$name 1]} message]} {
                    lappend problems [list table $where "-$name is refused: $message"]
                    set type bool
                    set repeat 0
                } else {
                    set type value
                    $interp eval [list testkit::reset $object]
                    set repeat [expr {![catch {$interp eval [list $object $word {*}$dummies -$name 1 -$name 2]}]
                                      && "1 2" in [lindex [$interp eval [list testkit::calls $object]] 0]}]
                }
                lappend described [list $name $default $type $repeat]
            }
            dict set row options $described
            dict set row tail $tail
            lappend checked $row
        }
        dict set tables $class $checked
        $interp eval [list rename $object {}]
    }
    return $tables
}

# --- The tool's help -------------------------------------------------------------------------------

# A dict of call, does and returns of a usage line.
proc reference::usage {line} {
    regexp {^Usage: ([^:]*): (.*)$} $line -> call text
    if {[regexp {^(.*); returns (.*)$} $text -> does returns]} {
        return [dict create call $call does $does returns $returns]
    }
    regexp {^returns (.*)$} $text -> returns
    return [dict create call $call does "" returns $returns]
}

# The placeholder an option's value takes in a synopsis, or empty.
proc reference::placeholder {call name} {
    set start [string first "?-$name " $call]
    if {$start < 0} { return "" }
    set text [string range $call [expr {$start + [string length $name] + 3}] end]
    if {[string index $text 0] eq "\{"} {
        return [string range $text 0 [string first "\}" $text]]
    }
    if {![regexp {^[^ ?]+} $text word]} { return "" }
    return $word
}

# Checks the synopsis of a usage line against the row of the table.
proc reference::checkSynopsis {root row call problemsVar} {
    upvar 1 $problemsVar problems
    set where "$root [dict get $row word]"
    set positionals {}
    foreach token [lrange [split $call] 2 end] {
        if {[string match {\?*} $token]} break
        lappend positionals $token
    }
    if {[llength $positionals] != [dict get $row count]} {
        lappend problems [list help $where "the synopsis has [llength $positionals] positionals, the table [dict get $row count]"]
    } elseif {[dict get $row count] > 0 && [string match *... [lindex $positionals end]] != [dict get $row tail]} {
        lappend problems [list help $where "the synopsis and the package differ on whether the last positional may be repeated"]
    }
    set named [lmap {-> name} [regexp -all -inline {\?-(\w+)} $call] {set name}]
    set declared [lmap o [dict get $row options] {lindex $o 0}]
    if {$named ne $declared} {
        lappend problems [list help $where "the synopsis names the options {$named}, the table {$declared}"]
    }
}

# --- What is written by hand ----------------------------------------------------------------------

# Reads the entries file: a dict with intro, failures (text and errors), common (word -> entry),
# entries (root word -> entry) and problems.
proc reference::readEntries {file} {
    set reader [interp create -safe]
    set data [dict create intro "" failures {text "" errors ""} common {} entries {}]
    foreach command {intro failures common entry} {
        $reader alias $command reference::collect $command
    }
    set fd [open $file]
    set script [read $fd]
    close $fd
    variable collected $data
    variable readProblems {}
    try {
        $reader eval $script
    } finally {
        interp delete $reader
    }
    return [dict replace $collected problems $readProblems]
}

# An entry as written, with the parts it may leave out; a part it must have and does not is a
# problem of the reader's list.
proc reference::complete {where entry required} {
    variable readProblems
    foreach key $required {
        if {![dict exists $entry $key]} {
            lappend readProblems [list entry $where "the entry has no $key"]
            dict set entry $key ""
        }
    }
    return [dict merge [dict create after "" errors ""] $entry]
}

proc reference::collect {what args} {
    variable collected
    switch $what {
        intro { dict set collected intro [lindex $args 0] }
        failures { dict set collected failures [dict create text [lindex $args 0] errors [lindex $args 1]] }
        common {
            lassign $args word entry
            dict set collected common $word [complete $word $entry {synopsis does returns fails example}]
        }
        entry {
            lassign $args root word entry
            dict set collected entries [list $root $word] [complete "$root $word" $entry {fails example}]
        }
    }
}

# Markdown of a written text: the lines without their indentation, paragraphs and list items kept.
proc reference::prose {text} {
    set lines [lmap line [split [string trim $text \n] \n] {string trim $line}]
    return [join $lines \n]
}

# The commands of an example script, one element each, in order.
proc reference::steps {script} {
    set steps {}
    set pending ""
    foreach line [split $script \n] {
        set line [string trim $line]
        if {$pending eq "" && $line eq ""} continue
        append pending [expr {$pending eq "" ? "" : "\n"}] $line
        if {[info complete $pending]} {
            lappend steps $pending
            set pending ""
        }
    }
    if {$pending ne ""} { lappend steps $pending }
    return $steps
}

# --- Running the examples -------------------------------------------------------------------------

# What the runner does in kelmarsh: every step printed as typed with its answer. An example step
# must not raise an error; an error step must raise one or answer 0, as the project commands answer
# a failure, unless it only reads a variable (`set msg`, the reason of such a failure). A step that
# does not do so is marked.
variable reference::runner {
    proc reference_run {kind steps} {
        puts "@@$kind"
        foreach step $steps {
            set raised [catch {uplevel #0 $step} answer]
            if {$kind eq "after"} {
                if {$raised} { puts "@@fault $step" }
                continue
            }
            puts "% [join [split $step \n] "\n  "]"
            set lines [split [string trimright $answer] \n]
            if {$raised} { lset lines 0 "error: [lindex $lines 0]" }
            foreach line $lines { puts [string trimright "  $line"] }
            set refused [expr {$raised || (![catch {lindex $answer 0} first] && $first eq "0")}]
            set reading [regexp {^set \S+$} $step]
            if {$kind eq "example" ? $raised : !$refused && !$reading} { puts "@@fault $step" }
        }
    }
}

# Runs the steps of an entry in a fresh kelmarsh on a copy of the sample design: first the steps it
# comes after, then the example's and the error steps; a dict of example and errors (the
# transcripts) and faults (a list of texts).
proc reference::run {kelmarsh design scratch after example errors} {
    variable runner
    file delete -force $scratch
    file mkdir $scratch
    set scratch [file normalize $scratch]
    file copy $design [file join $scratch counter.json]
    set fd [open [file join $scratch run.tcl] w]
    puts $fd $runner
    puts $fd [list reference_run after [steps $after]]
    puts $fd [list reference_run example [steps $example]]
    puts $fd [list reference_run errors [steps $errors]]
    close $fd
    set here [pwd]
    cd $scratch
    try {
        set failed [catch {exec $kelmarsh -project counter.json run.tcl 2>stderr.txt} output]
    } finally {
        cd $here
    }
    set fd [open [file join $scratch stderr.txt]]
    set stderr [read $fd]
    close $fd
    file delete -force $scratch
    set output [string map [list $scratch/ ./ $scratch .] $output]
    set result [dict create example {} errors {} faults {}]
    if {$failed || $stderr ne ""} {
        dict lappend result faults "kelmarsh failed: [string trim "$stderr\n$output"]"
    }
    set part ""
    foreach line [split $output \n] {
        if {[regexp {^@@(after|example|errors)$} $line -> part]} continue
        if {[regexp {^@@fault (.*)$} $line -> step]} {
            dict lappend result faults [expr {$part eq "errors" ? "does not fail: $step" : "fails: $step"}]
            continue
        }
        if {$part in {example errors}} { dict lappend result $part $line }
    }
    return $result
}

# --- The reference --------------------------------------------------------------------------------

proc reference::anchor {title} {
    return [regsub -all {[^a-z0-9_-]} [string map {" " -} [string tolower $title]] ""]
}

proc reference::sentence {text} {
    return "[string toupper [string index $text 0]][string range $text 1 end]"
}

proc reference::block {lines} {
    return "```\n[join $lines \n]\n```\n"
}

# The markdown of one command.
proc reference::section {title synopsis does returns options entry run} {
    set md "### $title\n\n"
    append md [block [list $synopsis]] \n
    if {$does ne ""} { append md "[sentence [prose $does]]. " }
    append md "**Returns** $returns.\n\n"
    if {[llength $options] > 0} {
        append md "| Option | Takes | Default |\n|---|---|---|\n"
        foreach o $options {
            lassign $o name default type repeat placeholder
            if {$type eq "bool"} {
                set takes "a boolean; alone it means true"
            } else {
                set takes [expr {$placeholder eq "" ? "a value" : "`$placeholder`"}]
                if {$repeat} { append takes "; given again, every value is kept" }
            }
            append md "| `-$name` | $takes | `$default` |\n"
        }
        append md "\n"
    }
    set after [string trim [dict get $entry after]]
    if {$after ne ""} {
        append md "**Example**, after `[join [steps $after] "`, `"]`:\n\n"
    } else {
        append md "**Example**\n\n"
    }
    append md [block [dict get $run example]] \n
    append md "**Fails** [prose [dict get $entry fails]]\n\n"
    if {[llength [dict get $run errors]] > 0} {
        append md "After the example, in the same shell:\n\n" [block [dict get $run errors]] \n
    }
    return $md
}

# What the code says: a dict of tables (wrapper class -> rows, checked against the package, see
# probe) and help (root -> class, summary, words and usage by word). Problems go to the caller's list.
proc reference::facts {lib problemsVar} {
    upvar 1 $problemsVar problems
    variable top
    set interp [interp create]
    try {
        $interp eval [list set auto_path [list $lib {*}$::auto_path]]
        $interp eval {package require KelmarTool}
        set tables [probe $interp [readTables $top problems] problems]
        set help {}
        dict for {root summary} [$interp eval {kelmartool::help}] {
            regexp {^::kelmar::(I\w+?)\d+$} [$interp eval [list kelmartool::object $root]] -> iface
            dict set help $root class TclWrap$iface
            dict set help $root summary $summary
            dict set help $root words [$interp eval [list kelmartool::help $root]]
            foreach word [dict get $help $root words] {
                dict set help $root usage $word [usage [$interp eval [list kelmartool::help $root $word]]]
            }
        }
    } finally {
        interp delete $interp
    }
    return [dict create tables $tables help $help]
}

# Builds the reference. Options: -lib DIR (required), -entries FILE, -scratch DIR. Returns a dict of
# text (the markdown) and problems (a list of {kind where text}; the text is only complete without
# problems).
proc reference::build {args} {
    variable top
    variable here
    set opts [dict merge [dict create -entries [file join $here entries.tcl] -scratch ""] $args]
    set lib [file normalize [dict get $opts -lib]]
    set scratch [dict get $opts -scratch]
    if {$scratch eq ""} { set scratch [file join [file dirname $lib] reference-scratch] }
    set kelmarsh [file join [file dirname $lib] bin kelmarsh]
    set design [file join $top examples designs counter.json]
    set problems {}
    set facts [facts $lib problems]
    set data [readEntries [dict get $opts -entries]]
    lappend problems {*}[dict get $data problems]
    set entries [dict get $data entries]

    # Runs the steps of an entry in a scratch folder of its own; its faults become problems.
    set number 0
    set runEntry {{where entry} {
        upvar 1 problems problems kelmarsh kelmarsh design design scratch scratch number number
        set run [reference::run $kelmarsh $design [file join $scratch [incr number]] \
                     [dict get $entry after] [dict get $entry example] [dict get $entry errors]]
        foreach fault [dict get $run faults] { lappend problems [list example $where $fault] }
        return $run
    }}

    set used {}
    set body ""
    set toc "## Contents\n\n- [format {[How commands fail](#%s)} [anchor "How commands fail"]]\n"
    dict for {root about} [dict get $facts help] {
        set class [dict get $about class]
        set rows [dict get $facts tables $class]
        set words [lmap row $rows {dict get $row word}]
        if {[dict get $about words] ne $words} {
            lappend problems [list help $root "the help lists [dict get $about words], the table $words"]
        }
        set frames [lsort -unique [lmap row $rows {dict get $row kind}]]
        append toc "- [format {[%s](#%s)} $root [anchor $root]]: [dict get $about summary]\n "
        append body "## $root\n\n[sentence [dict get $about summary]]. The commands of `$class`, reached"
        append body " as `$root` (`::kelmartool::$root`). [frameText $frames]\n\n"
        foreach row $rows {
            set word [dict get $row word]
            append toc " [format {[%s](#%s)} $word [anchor "$root $word"]]"
            if {![dict exists $about usage $word]} {
                lappend problems [list help "$root $word" "the tool has no usage line"]
                continue
            }
            set usage [dict get $about usage $word]
            checkSynopsis $root $row [dict get $usage call] problems
            if {![dict exists $entries [list $root $word]]} {
                lappend problems [list entry "$root $word" "no hand-written entry"]
                continue
            }
            lappend used [list $root $word]
            set entry [dict get $entries [list $root $word]]
            set run [apply $runEntry "$root $word" $entry]
            set options [lmap o [dict get $row options] {
                list {*}$o [placeholder [dict get $usage call] [lindex $o 0]]
            }]
            append body [section "$root $word" [dict get $usage call] [dict get $usage does] \
                             [dict get $usage returns] $options $entry $run]
        }
        append toc \n
    }
    dict for {key entry} $entries {
        if {$key ni $used} { lappend problems [list entry $key "an entry for a command that does not exist"] }
    }

    set common ""
    dict for {word entry} [dict get $data common] {
        append toc "- [format {[Every object: %s](#%s)} $word [anchor "Every object: $word"]]\n"
        set run [apply $runEntry $word $entry]
        set md [section "Every object: $word" [dict get $entry synopsis] [dict get $entry does] \
                    [dict get $entry returns] {} $entry $run]
        append common [string map {"### " "## "} $md]
    }
    set failures [dict get $data failures]
    set run [apply $runEntry failures [dict create after "" example "" errors [dict get $failures errors]]]

    set text "# Command reference\n\n"
    append text "<!-- Generated by `make docs` from the command tables, the tool's help and docs/reference/entries.tcl; do not edit. -->\n\n"
    append text [prose [dict get $data intro]] "\n\n" $toc "\n"
    append text "## How commands fail\n\n" [prose [dict get $failures text]] "\n\n" [block [dict get $run errors]] "\n"
    append text $body $common
    file delete -force $scratch
    return [dict create text [string trimright $text \n]\n problems $problems]
}

proc reference::frameText {frames} {
    switch $frames {
        Plain { return "Its commands take exactly the words shown; a word ending in `Var` names a variable the command sets." }
        Matched { return "Options come after the positionals and may be abbreviated as far as they are unique." }
        Switch { return "Options are spelled in full; the commands take no positional word." }
    }
}

if {[info exists argv0] && [file normalize $argv0] eq [file normalize [info script]]} {
    if {[llength $argv] < 2} {
        puts stderr "usage: tclsh8.6 [info script] LIBDIR OUT ?SCRATCH?"
        exit 2
    }
    lassign $argv lib out scratch
    set result [reference::build -lib $lib -scratch $scratch]
    if {[llength [dict get $result problems]] > 0} {
        foreach problem [dict get $result problems] {
            lassign $problem kind where text
            puts stderr "$kind: $where: $text"
        }
        exit 1
    }
    set fd [open $out w]
    puts -nonewline $fd [dict get $result text]
    close $fd
}
