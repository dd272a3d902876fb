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
