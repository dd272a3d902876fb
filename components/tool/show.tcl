# kelmartool::show ?WINDOW?: a Tk window drawing the view's scene (kelmartool::scene of the rectangle
# kelmartool::shown gives), scaled to its canvas. Tk is loaded only when show is called: the tool and
# the package run with no display.
#
# Every canvas item carries the tags `kind:<kind>` and `name:<object>`, the status line names the
# object under the pointer (and the mouse's bindings when over none). The mouse works through the
# view and selection interfaces, as a script would, so that `view previous` undoes a zoom or a pan:
# the wheel calls `view zoom -in`/`-out`, a drag `view pan -delta`, a drag with Shift or with the
# right button draws a box and calls `view zoom -range` with it, and a click (the pointer moved at
# most `threshold` pixels) calls `selection new`. The checkbutton "fly-lines (n)", or the key n, draws
# every net meeting the view as a fly-line (`kelmartool::scene -nets all`), not only marked ones.
#
# Redrawing: the tool counts the changes of what the scene shows (kelmartool::changes), whatever
# command word made them, and runs the window's script once in the idle pass after them. A window
# is redrawn when the count, its size or the fly-line choice differs from those it was drawn with.
# A script set there before the first window opened still runs, before the redraw, and is set back
# when the last window closes.
namespace eval ::kelmartool::window {
    variable pending {}       ;# the `after idle` id of a redraw for a new size, {} when none
    variable windows {}       ;# the open windows
    variable redraws 0        ;# how many windows were redrawn, for whoever measures them
    variable nets marked      ;# the fly-lines drawn: marked or all
    variable threshold 4      ;# pixels the pointer moves before a press is a drag, not a click
    variable hint "drag: pan   shift-drag or right-drag: zoom to a box   wheel: zoom   click: select"
    variable selectionColour #ff00ff
    variable chained {}       ;# the change script set before the first window opened
}

proc ::kelmartool::show {{w .kelmarview}} {
    ::kelmartool::window::loadTk
    namespace upvar ::kelmartool::window windows windows
    if {![winfo exists $w]} {
        toplevel $w
        wm title $w "KelmarTool view"
        canvas $w.c -width 640 -height 480 -background white -highlightthickness 0
        frame $w.bar
        label $w.status -anchor w -text $::kelmartool::window::hint
        checkbutton $w.nets -text "fly-lines (n)" -variable ::kelmartool::window::nets -onvalue all -offvalue marked \
            -command ::kelmartool::window::schedule
        pack $w.nets -in $w.bar -side right
        pack $w.status -in $w.bar -side left -fill x -expand 1
        pack $w.bar -side bottom -fill x
        pack $w.c -side top -fill both -expand 1
        bind $w.c <Configure> ::kelmartool::window::schedule
        bind $w.c <Motion> [list ::kelmartool::window::hover $w %x %y]
        bind $w.c <Leave> [list $w.status configure -text $::kelmartool::window::hint]
        bind $w.c <ButtonPress-1> [list ::kelmartool::window::press $w pan %x %y]
        bind $w.c <Shift-ButtonPress-1> [list ::kelmartool::window::press $w box %x %y]
        bind $w.c <ButtonPress-3> [list ::kelmartool::window::press $w box %x %y]
        bind $w.c <B1-Motion> [list ::kelmartool::window::drag $w %x %y]
        bind $w.c <B3-Motion> [list ::kelmartool::window::drag $w %x %y]
        bind $w.c <ButtonRelease-1> [list ::kelmartool::window::release $w %x %y]
        bind $w.c <ButtonRelease-3> [list ::kelmartool::window::release $w %x %y]
        bind $w <KeyPress-n> ::kelmartool::window::toggleNets
        bind $w.c <MouseWheel> [list ::kelmartool::window::wheel %D]
        bind $w.c <Button-4> [list ::kelmartool::window::wheel 1]
        bind $w.c <Button-5> [list ::kelmartool::window::wheel -1]
        bind $w <Destroy> [list ::kelmartool::window::forget $w %W]
        lappend windows $w
    }
    set script [::kelmartool::changes -command]
    if {$script ne "::kelmartool::window::changed"} {
        set ::kelmartool::window::chained $script
        ::kelmartool::changes -command ::kelmartool::window::changed
    }
    ::kelmartool::window::schedule
    return $w
}

namespace eval ::kelmartool::window {
    # Loads Tk. Tk makes a global `selection` (the X selection) over the tool's imported root of that
    # name: the tool's keeps the global name and Tk's becomes ::tk::selection, which Tk's own
    # procedures in ::tk find first.
    proc loadTk {} {
        if {![catch {package present Tk}]} return
        set imported [expr {[namespace which -command ::selection] ne {}
                            && [namespace origin ::selection] eq "::kelmartool::selection"}]
        package require Tk
        if {$imported && [namespace origin ::selection] ne "::kelmartool::selection"} {
            rename ::selection ::tk::selection
            namespace eval :: { namespace import ::kelmartool::selection }
        }
    }

    # Tk for a picture (kelmartool::snapshot of a PNG): its main window, which a tclsh shows once Tk
    # is loaded, is withdrawn when this loads it.
    proc pictureTk {} {
        if {![catch {package present Tk}]} return
        loadTk
        wm withdraw .
    }

    # The PNG data of a binary PPM picture.
    proc png {ppm} {
        set image [image create photo -data $ppm -format ppm]
        try {
            return [$image data -format png]
        } finally {
            image delete $image
        }
    }

    # A redraw in the next idle pass, for a window whose size or fly-line choice changed; a change
    # of the tool's state comes through kelmartool::changes.
    proc schedule {} {
        variable pending
        variable windows
        if {$pending ne {} || ![llength $windows]} return
        set pending [after idle ::kelmartool::window::redrawAll]
    }

    proc forget {w destroyed} {
        variable windows
        variable drawn
        if {$destroyed ne $w} return
        set windows [lsearch -all -inline -exact -not $windows $w]
        unset -nocomplain drawn($w)
        if {![llength $windows]} {
            variable chained
            ::kelmartool::changes -command $chained
            set chained {}
        }
    }

    # The change script of the open windows: the one set before them, then the redraw. An error of
    # the former is the tool's background error, as it would be with no window.
    proc changed {} {
        variable chained
        catch {uplevel #0 $chained} message options
        redrawAll
        return -options $options $message
    }

    # Redraws each window whose picture is out of date: drawn at another count of changes, size or
    # fly-line choice, or not at all.
    proc redrawAll {} {
        variable pending
        variable windows
        variable redraws
        variable drawn
        variable nets
        after cancel $pending
        set pending {}
        foreach w $windows {
            if {![winfo exists $w]} continue
            set now [list [::kelmartool::changes] [winfo width $w.c] [winfo height $w.c] $nets]
            if {[info exists drawn($w)] && $drawn($w) eq $now} continue
            set drawn($w) $now
            incr redraws
            redraw $w
        }
    }

    # Draws a window again at the next idle pass even when nothing it shows changed: after a drag
    # moved its items or drew a box.
    proc refresh {w} {
        variable drawn
        unset -nocomplain drawn($w)
        schedule
    }

    proc toggleNets {} {
        variable nets
        set nets [expr {$nets eq "all" ? "marked" : "all"}]
        schedule
    }

    # The mapping from sites (y up) to canvas pixels (y down): the rectangle fits the canvas, centred.
    proc transform {w rect} {
        lassign $rect x0 y0 x1 y1
        set width [winfo width $w.c]
        set height [winfo height $w.c]
        if {$width < 2} { set width [$w.c cget -width] }
        if {$height < 2} { set height [$w.c cget -height] }
        set scale [expr {min(($width - 8.0) / ($x1 - $x0), ($height - 8.0) / ($y1 - $y0))}]
        set ox [expr {($width - $scale * ($x1 - $x0)) / 2.0}]
        set oy [expr {($height - $scale * ($y1 - $y0)) / 2.0}]
        return [list $x0 $y1 $scale $ox $oy]
    }
    proc toCanvas {map coords} {
        lassign $map x0 y1 scale ox oy
        set out {}
        foreach {x y} $coords {
            lappend out [expr {$ox + ($x - $x0) * $scale}] [expr {$oy + ($y1 - $y) * $scale}]
        }
        return $out
    }
    proc toSites {w x y} {
        variable maps
        lassign $maps($w) x0 y1 scale ox oy
        list [expr {$x0 + ($x - $ox) / $scale}] [expr {$y1 - ($y - $oy) / $scale}]
    }

    proc redraw {w} {
        variable maps
        set c $w.c
        $c delete all
        variable nets
        variable selectionColour
        if {[catch {kelmartool::shown} rect] || [catch {kelmartool::scene -nets $nets} scene]} {
            $w.status configure -text "no design open"
            return
        }
        set map [transform $w $rect]
        set maps($w) $map
        set scale [lindex $map 2]
        foreach item $scene {
            dict with item {}
            set tags [list item kind:$kind name:$name]
            set xy [toCanvas $map $coords]
            switch -- $kind {
                grid {
                    # Ruled at every whole site, when the sites are wide enough to see.
                    if {$scale < 4} continue
                    lassign $coords gx0 gy0 gx1 gy1
                    for {set x [expr {int(ceil($gx0))}]} {$x <= $gx1} {incr x} {
                        $c create line {*}[toCanvas $map [list $x $gy0 $x $gy1]] -fill $outline -tags $tags
                    }
                    for {set y [expr {int(ceil($gy0))}]} {$y <= $gy1} {incr y} {
                        $c create line {*}[toCanvas $map [list $gx0 $y $gx1 $y]] -fill $outline -tags $tags
                    }
                }
                net {
                    lassign $xy fx fy
                    foreach {x y} [lrange $xy 2 end] {
                        $c create line $fx $fy $x $y -fill $outline -tags $tags
                    }
                }
                path {
                    $c create line {*}$xy -fill $outline -width 2 -tags $tags
                }
                default {
                    set width [expr {$outline eq $selectionColour ? 3 : 1}]
                    $c create rectangle {*}$xy -fill $fill -outline $outline -width $width -tags $tags
                    lassign $xy ax ay bx by
                    if {$kind eq "prohibited"} {
                        $c create line $ax $ay $bx $by -fill $outline -tags cross
                        $c create line $ax $by $bx $ay -fill $outline -tags cross
                    }
                    if {$label ne {} && $scale >= 24 && $kind ne "device"} { putLabel $c $kind $name $label $fill $ax $ay $bx $by }
                }
            }
        }
        # Names stay readable over the fly-lines and the path.
        $c raise label
    }

    # A label where it fits, as the SVG picture puts it: above a block, whose inside its cells fill,
    # inside the top of a bank, in the middle of anything else that is wide enough for it; there on
    # the item's fill, so that lines crossing it leave it readable.
    proc putLabel {c kind name text fill ax ay bx by} {
        set font {Helvetica 8}
        set top [expr {min($ay, $by)}]
        set x [expr {($ax + $bx) / 2.0}]
        switch -- $kind {
            block { set y [expr {$top - 7}] }
            bank { set y [expr {$top + 9}] }
            default {
                if {[font measure $font $text] > abs($bx - $ax) - 2} return
                set y [expr {($ay + $by) / 2.0}]
            }
        }
        set id [$c create text $x $y -text $text -font $font -fill [expr {$kind eq "block" ? "#2060c0" : "#202020"}] \
            -tags [list label label:$name]]
        if {$kind ni {block bank} && $fill ne {}} {
            lassign [$c bbox $id] tx0 ty0 tx1 ty1
            $c lower [$c create rectangle $tx0 $ty0 $tx1 $ty1 -fill $fill -outline {} -tags [list label label:$name]] $id
        }
    }

    # Which kind of item the pointer names first where several lie under it: the objects before
    # the lines drawn over them, so that a fly-line ending in a cell does not hide the cell, and a
    # bank, which lies under everything, last. Grid, device and density are no objects to name.
    variable pickOrder {port cell block site prohibited path net bank}

    # The object under a canvas point, {kind name}: of the kind first in pickOrder, the topmost of
    # those; {} when none.
    proc objectAt {w x y} {
        variable pickOrder
        set c $w.c
        set found {}
        set foundRank [llength $pickOrder]
        foreach id [lreverse [$c find overlapping $x $y $x $y]] {
            set kind {}
            set name {}
            foreach tag [$c gettags $id] {
                if {[string match kind:* $tag]} { set kind [string range $tag 5 end] }
                if {[string match name:* $tag]} { set name [string range $tag 5 end] }
            }
            set rank [lsearch -exact $pickOrder $kind]
            if {$rank >= 0 && $rank < $foundRank && $name ne {}} {
                set found [list $kind $name]
                set foundRank $rank
            }
        }
        return $found
    }

    proc hover {w x y} {
        variable hint
        lassign [objectAt $w $x $y] kind name
        if {$name eq {}} { $w.status configure -text $hint; return }
        set text "$kind $name"
        if {$kind eq "cell" && ![catch {::kelmartool::obj get $name cell_type} type]} { append text "  type $type" }
        if {![catch {::kelmartool::obj get $name site} site]} { append text "  site $site" }
        $w.status configure -text $text
    }

    # A click selects what is under the pointer, or clears the selection on empty ground.
    proc click {w x y} {
        lassign [objectAt $w $x $y] kind name
        if {$name eq {} || $kind eq "path"} {
            catch { ::kelmartool::selection clear }
        } else {
            catch { ::kelmartool::selection new $name }
        }
    }

    # A press starts a drag that pans the view, or one that draws a box to zoom to; it is a click
    # until the pointer moves more than `threshold` pixels away.
    proc press {w mode x y} {
        variable presses
        set presses($w) [dict create mode $mode x $x y $y lastX $x lastY $y moved 0]
    }

    proc moved {w x y} {
        variable presses
        variable threshold
        if {![info exists presses($w)]} { return 0 }
        if {[dict get $presses($w) moved]} { return 1 }
        set far [expr {max(abs($x - [dict get $presses($w) x]), abs($y - [dict get $presses($w) y])) > $threshold}]
        if {$far} { dict set presses($w) moved 1 }
        return $far
    }

    # While dragging, the picture follows the pointer, or the box grows with it; the view changes
    # once, on release.
    proc drag {w x y} {
        variable presses
        if {![moved $w $x $y]} return
        set c $w.c
        set press $presses($w)
        if {[dict get $press mode] eq "pan"} {
            $c move all [expr {$x - [dict get $press lastX]}] [expr {$y - [dict get $press lastY]}]
            dict set presses($w) lastX $x
            dict set presses($w) lastY $y
        } else {
            $c delete box
            $c create rectangle [dict get $press x] [dict get $press y] $x $y -outline #202020 -dash {4 2} -tags box
        }
    }

    proc release {w x y} {
        variable presses
        variable maps
        if {![moved $w $x $y]} {
            set mode [expr {[info exists presses($w)] ? [dict get $presses($w) mode] : "pan"}]
            unset -nocomplain presses($w)
            if {$mode eq "pan"} { click $w $x $y }
            return
        }
        set mode [dict get $presses($w) mode]
        set x0 [dict get $presses($w) x]
        set y0 [dict get $presses($w) y]
        unset presses($w)
        if {[info exists maps($w)]} {
            set scale [lindex $maps($w) 2]
            if {$mode eq "pan"} {
                # The picture moved with the pointer, so the view moves the other way; y is up in sites.
                catch { ::kelmartool::view pan -delta [list [expr {($x0 - $x) / $scale}] [expr {($y - $y0) / $scale}]] }
            } else {
                catch { ::kelmartool::view zoom -range [concat [toSites $w $x0 $y0] [toSites $w $x $y]] }
            }
        }
        refresh $w
    }

    proc wheel {delta} {
        if {$delta > 0} { catch { ::kelmartool::view zoom -in } } elseif {$delta < 0} { catch { ::kelmartool::view zoom -out } }
    }
}
