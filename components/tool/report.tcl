# The report helpers of the Kelmar tool: the answers of the timing and floorplan commands, and any
# dict, as aligned text tables. The package index sources this file when it loads the tool.
#
#   kelmartool::report KIND RESULT ?-channel CHANNEL?
#
# gives the table as text, or writes it to CHANNEL and gives the empty string. A table is a line of
# column names, a line of dashes and one line per record; columns are two blanks apart, a column of
# numbers is aligned to the right. A failure carries the error code {KELMAR TOOL UNKNOWN REPORT KIND}
# or {KELMAR TOOL VALUE}, as the tool's own refusals do.

namespace eval ::kelmartool::reports {
    # Each kind: the form of its result, the columns a record may have in the order shown, and what
    # gives such a result. A list is a list of records, each a dict; a named dict maps a name (the
    # first column) to a record; a dict is shown as name and value.
    variable kinds {
        paths  {list  {startpoint endpoint clock arrival required slack points}
                {what timing run ANALYSIS or timing get ANALYSIS paths returns}}
        fanout {list  {net fanout} {what timing get ANALYSIS high_fanout returns}}
        drc    {list  {rule objects message} {what floorplan drc returns}}
        sso    {list  {bank outputs limit status ports} {what floorplan sso_analysis returns}}
        clocks {list  {block region nets count limit status} {what floorplan clock_analysis returns}}
        blocks {named {block cells size region capacity sites constraints} {what floorplan block_properties returns}}
        dict   {dict  {name value} {a dict, such as what settings properties returns}}
    }

    proc refuse {text} {
        return -code error -errorcode {KELMAR TOOL VALUE} "kelmartool::report: $text"
    }

    # The rows of `result` as a list of lists, one value per column of `columns`, which is cut down
    # to the columns the records have.
    proc rows {kind form columnsVar result} {
        upvar 1 $columnsVar columns
        variable kinds
        set takes "report $kind takes [lindex [dict get $kinds $kind] 2]"
        if {[catch {llength $result} count]} { refuse "the result is no list; $takes" }
        if {$form ne "list" && $count % 2 != 0} { refuse "the result is no dict; $takes" }
        if {$form eq "dict"} {
            set rows {}
            foreach {name value} $result { lappend rows [list $name $value] }
            return $rows
        }
        # A named result is a dict whose values are the records; its keys make the first column.
        set names {}
        set records $result
        set fields $columns
        if {$form eq "named"} {
            set names [dict keys $result]
            set records [dict values $result]
            set fields [lrange $columns 1 end]
        }
        set n 0
        foreach record $records {
            incr n
            if {[catch {dict keys $record} keys] || [llength $keys] == 0} {
                refuse "record $n of the result is no dict; $takes"
            }
            foreach key $keys {
                if {$key ni $fields} {
                    refuse "record $n of the result has the key \"$key\", but a $kind record has [join $fields {, }]"
                }
            }
            if {$n == 1} {
                set first $keys
            } elseif {[lsort $keys] ne [lsort $first]} {
                refuse "record $n of the result has the keys {$keys}, but record 1 has {$first}"
            }
        }
        # The columns the records have, in the order of the kind's columns.
        if {$n > 0} {
            set fields [lmap field $fields {if {$field ni $first} continue; set field}]
            set columns [expr {$form eq "named" ? [list [lindex $columns 0] {*}$fields] : $fields}]
        }
        set rows {}
        foreach record $records name $names {
            set row [lmap field $fields {dict get $record $field}]
            lappend rows [expr {$form eq "named" ? [list $name {*}$row] : $row}]
        }
        return $rows
    }

    # The aligned text of a header and rows; line ends and tabs in values become blanks.
    proc table {columns rows} {
        set rows [lmap row $rows {lmap value $row {string map {\n { } \r { } \t { }} $value}}]
        set formats {}
        set rules {}
        set i 0
        foreach column $columns {
            set width [string length $column]
            set numbers 1
            foreach row $rows {
                set value [lindex $row $i]
                set width [expr {max($width, [string length $value])}]
                if {$value ne "" && ![string is double -strict $value]} { set numbers 0 }
            }
            lappend formats [expr {$numbers && [llength $rows] > 0 ? "%${width}s" : "%-${width}s"}]
            lappend rules [string repeat - $width]
            incr i
        }
        set format [join $formats "  "]
        set lines {}
        foreach row [list $columns $rules {*}$rows] {
            lappend lines [string trimright [format $format {*}$row]]
        }
        join $lines \n
    }
}

proc ::kelmartool::report {args} {
    variable reports::kinds
    set usage "kelmartool::report KIND RESULT ?-channel CHANNEL?"
    if {[llength $args] != 2 && [llength $args] != 4} {
        return -code error -errorcode {TCL WRONGARGS} "wrong # args: should be \"$usage\""
    }
    lassign $args kind result option channel
    if {![dict exists $kinds $kind]} {
        return -code error -errorcode [list KELMAR TOOL UNKNOWN REPORT $kind] \
            "unknown report \"$kind\": use [join [lsort [dict keys $kinds]] {, }]"
    }
    if {[llength $args] == 4 && $option ne "-channel"} {
        return -code error -errorcode {TCL WRONGARGS} "bad option \"$option\": should be \"$usage\""
    }
    lassign [dict get $kinds $kind] form columns
    set rows [reports::rows $kind $form columns $result]
    set text [reports::table $columns $rows]
    if {[llength $args] == 2} { return $text }
    puts $channel $text
    return
}
