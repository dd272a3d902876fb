# The command line of the bench scripts: pairs of -name value, each name one of the keys of the
# dict in `optVar`, which takes the values given. A wrong line is an error with `usage`.
proc benchOptions {optVar argv usage} {
    upvar 1 $optVar opt
    if {[llength $argv] % 2} { error "usage: $usage" }
    foreach {name value} $argv {
        if {![dict exists $opt $name]} {
            error "unknown option \"$name\": must be one of [join [dict keys $opt] {, }]"
        }
        dict set opt $name $value
    }
}
