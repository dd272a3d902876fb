# The plain Tcl baseline: the collection's equal as a script author would write it, options
# matched by prefix against a dict of defaults, flags turned on where given.
oo::class create PlainCollection {
    variable defaults
    constructor {} {
        set defaults [dict create -order_dependent false]
    }
    method equal {first second args} {
        set options $defaults
        foreach word $args {
            dict set options [tcl::prefix match -message option [dict keys $defaults] $word] true
        }
        my Compare $first $second [dict get $options -order_dependent]
    }
    method Compare {first second ordered} {
        return
    }
}

# The view's zoom in plain Tcl: eleven options with their defaults, matched by prefix; the six
# flags are turned on where given, or take a true or false behind them, the other five take the
# word behind them.
oo::class create PlainView {
    variable defaults flags
    constructor {} {
        set defaults [dict create -full false -selection false -in false -out false -detailed false \
                          -last false -name (nil) -center {nil} -range {nil} -xrange {nil} -yrange {nil}]
        set flags {-full -selection -in -out -detailed -last}
    }
    method zoom {args} {
        set options $defaults
        for {set i 0} {$i < [llength $args]} {incr i} {
            set name [tcl::prefix match -message option [dict keys $defaults] [lindex $args $i]]
            if {$name in $flags} {
                set value true
                if {[lindex $args $i+1] in {true false}} {
                    set value [lindex $args [incr i]]
                }
                dict set options $name $value
            } elseif {[incr i] < [llength $args]} {
                dict set options $name [lindex $args $i]
            } else {
                error "option $name needs a value"
            }
        }
        my Zoom {*}[dict values $options]
    }
    method Zoom {full selection in out detailed last name center range xrange yrange} {
        return
    }
}
