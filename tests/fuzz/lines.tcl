# The random command lines of the fuzzer. fuzz.tcl sources this file into an interpreter of its
# own (the arena), in a fresh temporary folder that is the working directory, and calls fz::run.
#
# A line is a Tcl script. Hostile values appear in it as $::W(name), so that a logged line stays
# short and can be pasted into a shell that has sourced this file. Every line runs under catch; a
# line may itself run further lines from handlers, traces and default commands, up to a depth.

namespace eval fz {
    variable off {}          ;# classes of lines left out (-without)
    variable depth 0
    variable pool {}         ;# word -> class of the objects that answer commands here
    variable dead {}         ;# words of objects renamed away or deleted
    variable foreign {}      ;# words of objects made in child interpreters
    variable kept {}         ;# words here of objects made in child interpreters
    variable helpers {}      ;# words of project helpers the tool gave, which are no commands
    variable roots {}        ;# words behind the tool's root commands, kept by the sweeps
    variable kids {}         ;# child interpreters alive
    variable kidWords {}     ;# child -> the words it made
    variable rows {}         ;# class -> command words, from the listing an unknown word gives
    variable tags 0
    variable log {}
    variable injected 0
    variable here [file dirname [file normalize [info script]]]
    variable netlists {}     ;# the sample netlist, and the shipped delay library, as texts
}

proc fz::upto {n} { expr {int(rand() * $n)} }
proc fz::pick {list} { lindex $list [upto [llength $list]] }
proc fz::chance {p} { expr {rand() < $p} }
proc fz::on {class} { variable off; expr {$class ni $off} }
# A word of a line: `value` quoted as one word of a script.
proc fz::q {value} { list $value }
# The interface in an object word of the scripting support (::kelmar::ICollection7), or "".
proc fz::classOf {word} {
    if {[string length $word] > 80 || ![regexp {^::kelmar::([A-Za-z]+?)\d+$} $word -> class]} { return "" }
    return $class
}

# ---- Words ----------------------------------------------------------------------------------

# Evaluating a word as a script is a fault: this word says so when it happens.
proc fz::inject {} { set ::fz::injected 1; error "a word was evaluated" }

proc fz::hostileWords {} {
    array set ::W [list empty {} big [string repeat x 1048576] biglist [lrepeat 20000 r0] \
        nul "a\0b" nulonly "\0" badutf [encoding convertfrom identity \xff\xfe] surrogate "\ud800" \
        utf8 "\u00e9\u4e2d\U1F600" control "\x01\x1b\x7f" newline "a\nb" \
        open "\{" close "\}" openb "\[" closeb "\]" quote "\"" backslash "a\\" dollar {$x} \
        nested [string repeat "\{" 1000] script {[fz::inject]} varsub {$::fz::injected[fz::inject]} \
        listbreak "a \"b" spaces "  " dict {a {b} c} \
        e400 1e400 me400 -1e400 em400 1e-400 nan NaN inf Inf u32 4294967295 u32p 4294967304 \
        i32 2147483648 mi32 -2147483649 i64 9223372036854775808 mi64 -9223372036854775809 \
        hex 0x7fffffff octal 08 padded " 7 " minus0 -0 half 1.5 minus -1]
}

# The word tables: plain values and names of the sample designs, option names from the tool's help,
# variable names, relative file names (copies of the samples among them), identifiers.
proc fz::tables {designs copies} {
    variable words
    set names {}
    foreach text $designs {
        foreach {- name} [regexp -all -inline {"name": "([^"]+)"} $text] { lappend names $name }
    }
    set options {}
    foreach {root summary} [kelmartool::help] {
        foreach word [kelmartool::help $root] {
            lappend options {*}[regexp -all -inline {[?]-[a-z_]+} [kelmartool::help $root $word]]
        }
    }
    dict set words plain [list {} 0 1 2 -1 true false yes off NULL red yellow #ff0000 all cell net port \
        clock bank site project selection highlight paths fanout from to only except copy swap replace \
        merge ucf csv vhdl vlog columns rows {1 1} {0 0 3 3} {0 1} X0Y0 X3Y3 X7Y7 X99Y99 X0Y0:X3Y3 X3Y3:X0Y0 \
        a1 a2 c1 c2 blk_count b9 * *_n {r[0-9]} ( {[a-} .* max_paths default_highlight_color filter \
        max_items search_limit zoom_factor pan_percentage period:sys_clk input_delay region init]
    dict set words name [lsort -unique $names]
    dict set words option [lsort -unique [string map {? {}} $options]]
    dict set words var {msg out ::fz::v arr arr(k) {} ::nosuch::v ro ::ro(1) a(}
    dict set words file [concat $copies d0.json d1.json d2.json out.ucf out.csv out.vhd out.v rep.txt nosuch.json \
        {{}} . sub/x]
    dict set words id [concat [lmap v [info vars ::kelmar::TcltaskI::*ID] {string cat $ $v}] \
        $::fz::anyId 00000000-0000-0000-0000-000000000000 zz]
    dict set words cid [concat $::fz::componentIds $::fz::anyId 00000000-0000-0000-0000-000000000000 {{}}]
    dict set words number [concat {0 1 2 3 8 -1 2147483647 4294967304 0x10 1.5 {} x} [extremes]]
    dict set words helper {{[testkit::helper hh]} {[testkit::helper gg]} {[testkit::component cc]}}
    dict set words body {{} fz::act {fz::act; fz::act} break continue {error body} {return -code 7}}
    dict set words hostile [lmap n [array names ::W] {string cat {$::W(} $n )}]
}

# The identifier of CitI::IInterface, and those the lines keep components under on projects.
set fz::anyId c569a982-87c5-4d45-8a2c-17b796723bdc
set fz::componentIds {5d1e4b7a-2c3f-4e8a-9b6d-0f1a2b3c4d50 5d1e4b7a-2c3f-4e8a-9b6d-0f1a2b3c4d51
                      5d1e4b7a-2c3f-4e8a-9b6d-0f1a2b3c4d52}

# One word of a line, by kind: the fragments of `id`, `helper` and `hostile` are script already.
proc fz::word {{kind {}}} {
    variable words
    if {$kind eq ""} {
        set kind [pick {plain plain plain name name option option hostile hostile object id var file helper}]
    }
    switch $kind {
        option {
            set name [pick [dict get $words option]]
            return [q [string range $name 0 [expr {1 + [upto [string length $name]]}]]]
        }
        object {
            variable pool; variable dead; variable foreign; variable helpers
            return [q [pick [concat [dict keys $pool] [lrange $dead end-9 end] $foreign $helpers 0]]]
        }
        helper {
            variable helpers
            return [pick [concat [dict get $words helper] [lmap h $helpers {q $h}]]]
        }
        id - hostile - body { return [pick [dict get $words $kind]] }
        default { return [q [pick [dict get $words $kind]]] }
    }
}
proc fz::words {max} {
    set out {}
    for {set k [upto [expr {$max + 1}]]} {$k > 0} {incr k -1} { lappend out [word] }
    return $out
}

# The words of a call of `row` of `class`. Mostly they follow the row's usage in the tool's help:
# a word of a fitting kind for each positional, some of the row's options; now and then one of
# them is replaced by any word, or some words are added, or all words are random.
proc fz::arguments {class row} {
    variable usages
    if {[chance 0.1] || ![dict exists $usages $class $row]} { return [guarded $row [words 6]] }
    lassign [dict get $usages $class $row] positionals options
    set out {}
    foreach placeholder $positionals {
        set kind [switch -glob -- $placeholder {
            *Var - VAR { string cat var }  FILE { string cat file }  HELPER { string cat helper }
            ID { string cat cid }  IFACE { string cat id }  BODY { string cat body }
            COLUMNS - ROWS - BANKS - SSO_LIMIT - SITE_CAPACITY - CLOCK_LIMIT - POSITION { string cat number }
            default { pick {plain name name} }
        }]
        for {set k [expr {[string match *... $placeholder] ? 1 + [upto 3] : 1}]} {$k > 0} {incr k -1} {
            lappend out [word $kind]
        }
    }
    if {[llength $out] && [chance 0.2]} { lset out [upto [llength $out]] [word] }
    while {[llength $options] && [chance 0.4]} {
        set name [pick $options]
        lappend out [q [string range $name 0 [expr {1 + [upto [string length $name]]}]]]
        if {[chance 0.5]} { lappend out [word [pick {plain name plain hostile}]] }
    }
    if {[chance 0.1]} { lappend out {*}[words 2] }
    guarded $row $out
}
# The words of a call as a line's text. The body that foreach evaluates is a script by its nature,
# so the words that count a fault when evaluated stay out of that row.
proc fz::guarded {row words} {
    if {$row eq "foreach"} { set words [lsearch -all -inline -not -regexp $words {^\$::W\((script|varsub)\)$}] }
    join $words
}

# The usage of every command word of the tool's help, by the class of the root's object:
# {positionals options}; GetInterface, which every object answers, takes an ID.
proc fz::usages {} {
    variable usages {}
    foreach {root summary} [kelmartool::help] {
        set class [classOf [kelmartool::object $root]]
        dict set usages $class GetInterface {IFACE {}}
        foreach row [kelmartool::help $root] {
            set text [lindex [split [string map {"Usage: " ""} [kelmartool::help $root $row]] :] 0]
            set positionals {}
            foreach token [lrange [split $text] 2 end] {
                if {[string index $token 0] eq "?"} break
                lappend positionals $token
            }
            set options [lmap {- name} [regexp -all -inline {\?(-[a-z_]+)} $text] {set name}]
            dict set usages $class $row [list $positionals $options]
        }
    }
    foreach class {IHDProject IInterface} { dict set usages $class GetInterface {IFACE {}} }
}

# ---- Objects --------------------------------------------------------------------------------

# Takes a word that answers commands into the pool, with its class; the oldest go when it is full.
proc fz::adopt {word class} {
    variable pool; variable rows
    if {![dict exists $rows $class]} {
        catch {$word} listing
        dict set rows $class [lmap w [lrange [split $listing \n] 2 end] {
            if {[string trim $w] eq ""} continue
            string trim $w
        }]
        if {![llength [dict get $rows $class]]} { dict set rows $class GetInterface }
    }
    dict set pool $word $class
    if {[dict size $pool] > 120} {
        foreach old [lrange [dict keys $pool] 0 19] { catch {rename $old {}}; forget $old }
    }
}
proc fz::forget {word} {
    variable pool; variable dead
    dict unset pool $word
    lappend dead $word
    set dead [lrange $dead end-49 end]
}
# Object words in what a line gave back, or in the variables lines write, join the pool.
proc fz::harvest {value} {
    set values [list $value]
    foreach name {::out ::msg ::fz::v ::arr(k)} { if {[info exists $name]} { lappend values [set $name] } }
    foreach v $values {
        set class [classOf $v]
        if {$class eq ""} continue
        if {$class eq "IProjectHelper"} {
            if {![on helper]} continue
            variable helpers
            set helpers [lrange [lsort -unique [lappend helpers $v]] end-9 end]
        } elseif {[info commands $v] ne ""} {
            adopt $v $class
        }
    }
}

# A handler of kit objects: runs a line now and then, then answers something at random.
proc fz::handler {tag op args} {
    if {[chance 0.2]} { act }
    if {[on rename] && [chance 0.02]} { catch {moved $::fz::self($tag) ::fz::self$tag} }
    if {[on delete] && [chance 0.02]} { catch {rename $::fz::self($tag) {}} }
    answer
}
proc fz::answer {} {
    switch [upto 14] {
        0 { error "refused by the fuzzer" }
        1 { return -code break }
        2 { return -code 7 odd }
        3 { return "not a dict \{" }
        4 { return [list code 0 message [pick [array get ::W]]] }
        5 { return [list value [pick [array get ::W]]] }
        6 { return [list object [pick {new same null other}]] }
        7 { return [list helper [pick {hh gg {} nosuch}]] }
        8 { return [list string [pick [array get ::W]]] }
        9 { return [list code [pick {4294967304 -1 x 0 2}]] }
        10 { return {value v code 1 message m string s object same helper hh} }
        default { return {} }
    }
}
# A new kit object of a random class, with a handler, help, neither, or none behind it at all.
proc fz::make {class} {
    variable tags
    set tag [incr tags]
    switch [upto 4] {
        0 { set word [testkit::new $class -handler [list ::fz::handler $tag] -help [pick {{} %W {use %W}}]] }
        1 { set word [testkit::new $class -handler [list ::fz::handler $tag]] }
        2 { set word [testkit::new $class] }
        3 { set word [testkit::orphan $class] }
    }
    set ::fz::self($tag) $word
    adopt $word $class
    return $word
}

# ---- Design files ---------------------------------------------------------------------------

# Numbers that form classes of their own, for the design files and the tool's numeric words: beyond
# the range of a double (overflow), and device sizes whose square passes 2^31 (huge).
set fz::extremeNumbers {overflow {1e400 -1e400} huge {46341 65536 100000}}
proc fz::extremes {} {
    set out {}
    dict for {class numbers} $::fz::extremeNumbers { if {[on $class]} { lappend out {*}$numbers } }
    return $out
}

# Values a mutation puts in place of a number or a string of a design file.
set fz::jsonValues [list 1e-400 -1 0 4294967304 2147483648 -2147483649 1.5 null true \
    {[]} {{}} {""} {"x"} "\"[string repeat y 1048576]\"" "\"\xff\xfe\"" {"\u0000"} {"\ud800"} \
    {"X99999Y0:X0Y99999"} {"X0Y0:X4294967304Y0"} {"r0"} {"clk"}]

# A sample design with up to `most` of its numbers and strings replaced, fields deleted or its tail
# cut, written into one of a few files.
# A mutant of one of `texts` (by default the sample designs), written to one of `names`.
proc fz::mutant {{most 4} {texts {}} {names {d0.json d1.json d2.json}}} {
    variable designs
    set text [pick [expr {[llength $texts] ? $texts : $designs}]]
    for {set k [upto [expr {$most + 1}]]} {$k > 0} {incr k -1} {
        set spans [regexp -all -indices -inline -- {-?\d+(?:\.\d+)?(?:[eE][-+]?\d+)?|"(?:[^"\\]|\\.)*"} $text]
        if {![llength $spans]} break
        lassign [pick $spans] from to
        switch [upto 7] {
            0 { set text [string range $text 0 [upto [string length $text]]] }
            2 {
                foreach key {columns rows} {
                    regsub "\"$key\": *\[^,\}\]*" $text "\"$key\": [pick [dict get $::fz::words number]]" text
                }
            }
            1 {
                if {[regexp -indices {^"[^"]*"\s*:\s*(?:[-\d.eE+]+|"[^"]*"|true|false|null)\s*,?} \
                        [string range $text $from end] span]} {
                    set text [string replace $text $from [expr {$from + [lindex $span 1]}]]
                }
            }
            default {
                set values [concat $::fz::jsonValues [extremes]]
                set text [string replace $text $from $to [pick $values]]
            }
        }
    }
    set file [pick $names]
    set channel [open $file w]
    fconfigure $channel -translation binary
    puts -nonewline $channel $text
    close $channel
    return [file normalize $file]
}

# ---- Lines ----------------------------------------------------------------------------------

# The classes of lines: a weight and the proc that makes a line of the class. -without takes these
# names, and five more that leave out values, hand-overs and the end rather than lines:
#   overflow  numbers beyond the range of a double (1e400) in design files and numeric words
#   huge      device sizes whose square passes 2^31 (46341, 65536, 100000)
#   helper    the project helper words the tool gives, as arguments
#   keep      objects of child interpreters that this one keeps, through its project, after the
#             child is gone
#   teardown  the deletion of the arena at the end (fuzz.tcl), with the count of kit objects after it
# rename and delete also leave out what handlers do of the kind, child also that count, which loads
# the package once more.
set fz::classes {
    kit 40 kitLine  tool 30 toolLine  design 4 designLine  close 2 closeLine  make 3 makeLine
    rename 2 renameLine  delete 2 deleteLine  namespace 1 namespaceLine  trace 1 traceLine
    highlight 1 highlightLine  child 1 childLine  childcall 2 childCallLine  register 2 registerLine
    wrap 2 wrapLine  fault 1 faultLine  scene 2 sceneLine  netlist 1 netlistLine
}

proc fz::kitLine {} {
    variable pool; variable rows
    if {![dict size $pool]} { return "fz::make [pick [dict keys $rows]]" }
    # Objects of children are a few among many; they get a share of their own.
    set kept [lmap w $::fz::kept { if {[dict exists $pool $w]} { set w } else continue }]
    set word [pick [expr {[llength $kept] && [chance 0.1] ? $kept : [dict keys $pool]}]]
    set class [dict get $pool $word]
    set row [pick [dict get $rows $class]]
    return "[q $word] [q $row] [arguments $class $row]"
}
proc fz::toolLine {} {
    variable tool
    set root [pick [dict keys $tool]]
    set row [pick [dict get $tool $root words]]
    return "[q [dict get $tool $root command]] [q $row] [arguments [dict get $tool $root class] $row]"
}
proc fz::designLine {} {
    set file [mutant]
    pick [list "projmgr Open [q $file] msg" "kelmartool::open [q $file]" \
        "projmgr OpenWithHelper [q $file] [word] msg" \
        "file copy -force [q $file] \[project GetFileName\]; project Reload msg" "projmgr ReloadCurrent msg" \
        "project Sync msg" "projmgr SyncCurrent msg"]
}
# The view's scene and its picture, over the view or a rectangle of numbers, into the lines' files;
# the count of changes and a script for it, which no idle pass runs here.
proc fz::sceneLine {} {
    set rect "\[list [word number] [word number] [word number] [word number]\]"
    pick [list "kelmartool::scene" "kelmartool::scene -rect $rect" "kelmartool::scene [word option] [word]" \
        "kelmartool::scene -rect [word]" "kelmartool::snapshot [word file]" \
        "kelmartool::snapshot [word file] -width [word number] -height [word number]" \
        "kelmartool::snapshot [word file] [words 3]" "kelmartool::scene -nets [word] -rect $rect" \
        "kelmartool::snapshot [word file] -nets [word] -format [word]" "kelmartool::changes -command [word]"]
}
# An import of a mutant of the sample netlist, with one of the options, hostile words among them,
# or a mutant of the shipped delay library.
proc fz::netlistLine {} {
    variable netlists
    lassign $netlists netlist library
    set options [pick [list {} "-seed [word number]" "-device [word]" "-utilization [word number]" \
        "-clock [word]" "-clock clk=[word number]" "-top [word]" "[word option] [word]" \
        "-library [q [mutant 3 [list $library] {l0.json}]]"]]
    return "kelmartool::read_netlist [q [mutant 3 [list $netlist] {n0.json n1.json}]] $options -project p.design.json"
}
proc fz::closeLine {} {
    pick [list {projmgr CloseCurrent msg} {projmgr Close [project GetFileName] msg} {project Close} \
        "projmgr Close [word file] msg"]
}
proc fz::makeLine {} { return "fz::make [pick [dict keys $::fz::rows]]" }
# Another name for an object: in the global namespace, in ::kelmar, in a namespace that may go, or
# the word of an object that is gone or has another name now.
proc fz::renameLine {} {
    variable pool; variable dead
    if {![dict size $pool]} { return "fz::make IHighlight" }
    set word [pick [dict keys $pool]]
    set to [pick {::fz_renamed ::kelmar::renamed ::fzns::renamed ::fzns::inner::renamed}][upto 1000]
    if {[llength $dead] && [chance 0.2]} { set to [pick $dead] }
    return "fz::moved [q $word] [q $to]"
}
proc fz::moved {word to} {
    namespace eval [namespace qualifiers $to] {}
    set class [dict get $::fz::pool $word]
    rename $word $to
    forget $word
    adopt $to $class
    foreach {tag self} [array get ::fz::self] { if {$self eq $word} { set ::fz::self($tag) $to } }
}
proc fz::deleteLine {} {
    variable pool; variable roots
    set word [pick [concat [dict keys $pool] [expr {[chance 0.02] ? $roots : {}}]]]
    return "rename [q $word] {}; fz::forget [q $word]"
}
# The namespaces the default lines set their variables in: one per class and one per command.
proc fz::defaultSpaces {} {
    if {![namespace exists ::TcltaskI]} { return {} }
    set spaces {}
    foreach ns [namespace children ::TcltaskI] { lappend spaces $ns {*}[namespace children $ns] }
    return $spaces
}
# Those, ::TcltaskI itself now and then, and the namespaces of renamed objects.
proc fz::namespaceLine {} {
    set spaces [concat [defaultSpaces] ::fzns [expr {[chance 0.05] ? {::kelmar ::TcltaskI} : {}}]]
    return "namespace delete [q [pick $spaces]]"
}
proc fz::defaultVariables {} {
    set vars {}
    foreach ns [defaultSpaces] { lappend vars {*}[info vars ${ns}::*] }
    return $vars
}
# A trace on a default variable, or on the renaming and deletion of an object's command.
proc fz::traceLine {} {
    variable pool
    set vars [defaultVariables]
    if {[llength $vars] && [chance 0.5]} {
        return "trace add variable [q [pick $vars]] [q [pick {read write unset {read write unset}}]] ::fz::tracer"
    }
    # One trace a command at most: Tcl 8.6.13 itself crashes when a command with two traces on
    # rename and delete is deleted by the first of them while it is renamed.
    set word [pick [dict keys $pool]]
    if {$word eq "" || [catch {trace info command $word} traces] || $traces ne ""} { return [kitLine] }
    return "trace add command [q $word] {rename delete} ::fz::commandTracer"
}
# While an object's command is renamed or deleted: a line, a call of it, another name, its end.
proc fz::commandTracer {old new op} {
    switch [upto 4] {
        0 { act }
        1 { catch {$old GetInterface $::fz::anyId} }
        2 { catch {moved $old ::fz_traced[upto 1000]} }
        3 { catch {rename $old {}} }
    }
}
proc fz::tracer {name1 name2 op} {
    switch [upto 6] {
        0 { act }
        1 { error "trace refuses" }
        2 { uplevel 1 [list set $name1 [pick [array get ::W]]] }
        3 { uplevel 1 [list unset -nocomplain $name1] }
        4 { foreach t [trace info variable $name1] { trace remove variable $name1 {*}$t } }
        default {}
    }
}
# The command the default colour of `highlight add` runs: it forwards to the tool's root by default.
proc fz::highlightLine {} {
    return "set ::fz::highlightMode [pick {forward forward error line value break delete}]"
}
proc fz::highlight {args} {
    switch $::fz::highlightMode {
        error { error "no colour" }
        line { act }
        value { return [pick [array get ::W]] }
        break { return -code break }
        delete { rename ::highlight {}; interp alias {} ::highlight {} ::fz::highlight }
    }
    ::fz::tool::highlight {*}$args
}

# A child interpreter with the package, the kit and the tool, a design open, and objects whose
# words the parent takes: it can pass them as arguments, and lines can call them in the child.
proc fz::childLine {} {
    variable kids
    if {[llength $kids] >= 3} { return "fz::childGone [q [pick $kids]]" }
    return "fz::spawn [q [mutant]]"
}
proc fz::spawn {file} {
    variable anyId; variable componentIds
    set kid [interp create]
    lappend ::fz::kids $kid
    $kid eval [list array set ::W [array get ::W]]
    $kid eval [list lappend ::auto_path {*}$::auto_path]
    $kid eval {package require TcltaskI_TestKit; package require KelmarTool; namespace import ::kelmartool::*}
    catch {$kid eval [list projmgr Open $file msg]}
    set made [$kid eval {
        set made [lmap {root summary} [kelmartool::help] { kelmartool::object $root }]
        lappend made [project GetHDProject] [project GetProjectHelper] [testkit::new ICollection] \
            [testkit::new ITclProject]
    }]
    set ::fz::foreign [lrange [concat $::fz::foreign $made] end-59 end]
    dict set ::fz::kidWords $kid $made
    # Objects of the child pass to this interpreter through this project; they stay when it goes.
    if {![on keep]} { return $kid }
    if {[project GetFileName] eq ""} { projmgr Open [mutant 0] msg }
    # The child's project manager goes with two other roots: it can open a design in the child's
    # tool after the child is gone, for the others to work on.
    set others [lsearch -all -inline -not [dict keys $::fz::tool] kelmartool]
    set roots [list projmgr [pick $others] [pick $others]]
    foreach root $roots id $componentIds {
        set class [dict get $::fz::tool $root class]
        set ::fz::component [$kid eval [list $root GetInterface $anyId]]
        project RegisterComponent $id ::fz::component
        set word [[project GetComponent $id] GetInterface [set ::kelmar::TcltaskI::${class}ID]]
        adopt $word $class
        set ::fz::kept [lrange [lappend ::fz::kept $word] end-29 end]
    }
    return $kid
}
proc fz::childGone {kid} {
    variable kids
    set kids [lsearch -all -inline -not -exact $kids $kid]
    interp delete $kid
    dict unset ::fz::kidWords $kid
}
proc fz::childCallLine {} {
    variable kids; variable kidWords; variable rows
    if {![llength $kids]} { return [expr {[on child] ? [childLine] : [kitLine]}] }
    set kid [pick $kids]
    set word [pick [dict get $kidWords $kid]]
    set class [classOf $word]
    if {![dict exists $rows $class]} { set class ITclProject }
    set row [pick [dict get $rows $class]]
    set line "[q $word] [q $row] [arguments $class $row]"
    return "interp eval [q $kid] [q $line]"
}
# A component for the current project: any object of the pool or a root, or the current project
# itself; or the component kept under an identifier, or none any more.
proc fz::registerLine {} {
    variable pool; variable roots
    set word [expr {[chance 0.5] ? {$::fz::current} : [q [pick [concat [dict keys $pool] $roots]]]}]
    set register "projmgr GetCurrentTclProject ::fz::current msg
        set ::fz::component \[$word GetInterface $::fz::anyId\]
        project RegisterComponent [word cid] ::fz::component"
    pick [list $register "project GetComponent [word cid]" "project UnRegisterComponent ::fz::component"]
}
# A line of another class run in a namespace, a procedure body, or with a component fault on.
proc fz::wrapLine {} {
    set line [line]
    pick [list "namespace eval ::fzns [q $line]" "apply [q [list {} $line ::fzns::inner]]" \
        "uplevel #0 [q $line]"]
}
proc fz::faultLine {} {
    set what [pick {libTcltask_Support libArgMatchKit property matcher namelist}]
    return "testkit::fault $what on; try [q [line]] finally [q [list testkit::fault $what off]]"
}

# A line of a random class that is not left out.
proc fz::line {} {
    variable classes; variable off
    set total 0
    foreach {class weight maker} $classes { if {$class ni $off} { incr total $weight } }
    set at [upto $total]
    foreach {class weight maker} $classes {
        if {$class in $off} continue
        if {[incr at -$weight] < 0} { return [$maker] }
    }
}

# Makes and runs one line, nested lines only up to a depth; logs it first when asked to.
proc fz::act {} {
    variable depth; variable log
    if {$depth >= 3} return
    incr depth
    set text [line]
    if {$log ne ""} { puts $log "[string repeat {  } [expr {$depth - 1}]]$text"; flush $log }
    catch {uplevel #0 $text} result
    harvest $result
    incr depth -1
}

# ---- The run --------------------------------------------------------------------------------

# Sets the arena up: words, samples, kit objects of every class, the tool, the root `highlight`.
proc fz::setup {samples} {
    variable designs; variable tool; variable roots
    hostileWords
    variable here; variable netlists
    set netlists {}
    foreach file [list [file join $here netlist.json] [file join $here .. .. components tool netlist default_delays.json]] {
        set channel [open $file]
        lappend netlists [read $channel]
        close $channel
    }
    set designs {}
    foreach sample $samples {
        set channel [open $sample]
        lappend designs [read $channel]
        close $channel
        file copy $sample [file tail $sample]
    }
    package require TcltaskI_TestKit
    package require KelmarTool
    namespace eval :: {namespace import ::kelmartool::*}
    tables $designs [lmap sample $samples { file tail $sample }]
    usages
    array set ::arr {k v}
    set ::ro 1
    trace add variable ::ro write {apply {args {error "read-only"}}}
    namespace eval ::fzns::inner {}
    foreach class {ITclProject ITclProjectMgr ICollection IGlobal IGraphicalView IHighlight IObject
                   ISearch ISelection ITimingAnalysis IXFloorplan} {
        make $class
    }
    set tool {}
    set roots {}
    foreach {root summary} [kelmartool::help] {
        set word [kelmartool::object $root]
        dict set tool $root [dict create command $root words [kelmartool::help $root] class [classOf $word]]
        lappend roots $word
    }
    dict set tool kelmartool [dict create command kelmartool::help words [list {} {*}[dict keys $tool]] \
        class {}]
    namespace eval tool {}
    rename ::highlight ::fz::tool::highlight
    interp alias {} ::highlight {} ::fz::highlight
    dict set tool highlight command ::fz::tool::highlight
    set ::fz::highlightMode forward
    projmgr Open [mutant 0] msg
}

# Runs `count` lines from `seed`; gives the number of lines that ran.
proc fz::run {seed count without samples logFile} {
    variable off $without; variable log; variable injected
    expr {srand($seed)}
    setup $samples
    if {$logFile ne ""} { set log [open $logFile w] }
    for {set n 0} {$n < $count} {incr n} {
        act
        if {$n % 500 == 499} { sweep }
    }
    foreach kid $::fz::kids { interp delete $kid }
    if {$injected} { error "a word of a line was evaluated as a script" }
    return $count
}

# Keeps the arena small: the kit's events are forgotten, object words nobody uses go.
proc fz::sweep {} {
    variable pool; variable roots
    testkit::events
    foreach word [info commands ::kelmar::*] {
        if {![dict exists $pool $word] && $word ni $roots && [chance 0.5]} { catch {rename $word {}} }
    }
}
