# kelmartool::show ?WINDOW?: a Tk window drawing the view's scene (kelmartool::scene of the rectangle
# kelmartool::shown gives), scaled to its canvas. Tk is loaded only when show is called: the tool and
# the package run with no display.
#
# Every canvas item carries the tags `kind:<kind>` and `name:<object>`, the status line names the
# object under the pointer, the wheel zooms through `view zoom -in`/`-out` (so `view previous` undoes
# it) and a click selects through `selection new` (so `selection current` answers it).
#
# Redrawing: the tool's commands that change what the scene shows (view, highlight, selection,
# floorplan, timing, settings, obj, kelmartool::open and kelmartool::read_netlist) carry a leave trace
# that schedules one `after idle` redraw; a redraw already pending absorbs the others, so a script
# changing many objects is redrawn once, in the next idle pass.
namespace eval ::kelmartool::window {
    variable pending {}       ;# the `after idle` id of the redraw to come, {} when none
    variable windows {}       ;# the open windows
    variable traced 0         ;# whether the commands carry the redraw trace
    variable redraws 0        ;# how many redraws were done, for whoever measures them
    variable watched {::view ::highlight ::selection ::floorplan ::timing ::settings ::obj
                      ::kelmartool::view ::kelmartool::highlight ::kelmartool::selection
                      ::kelmartool::floorplan ::kelmartool::timing ::kelmartool::settings ::kelmartool::obj
                      ::kelmartool::open ::kelmartool::read_netlist}
}

proc ::kelmartool::show {{w .kelmarview}} {
    ::kelmartool::window::loadTk
    namespace upvar ::kelmartool::window windows windows
    if {![winfo exists $w]} {
        toplevel $w
        wm title $w "KelmarTool view"
        canvas $w.c -width 640 -height 480 -background white -highlightthickness 0
        label $w.status -anchor w -text {}
        pack $w.status -side bottom -fill x
        pack $w.c -side top -fill both -expand 1
        bind $w.c <Configure> ::kelmartool::window::schedule
        bind $w.c <Motion> [list ::kelmartool::window::hover $w %x %y]
        bind $w.c <Leave> [list $w.status configure -text {}]
        bind $w.c <ButtonRelease-1> [list ::kelmartool::window::click $w %x %y]
        bind $w.c <MouseWheel> [list ::kelmartool::window::wheel %D]
        bind $w.c <Button-4> [list ::kelmartool::window::wheel 1]
        bind $w.c <Button-5> [list ::kelmartool::window::wheel -1]
        bind $w <Destroy> [list ::kelmartool::window::forget $w %W]
        lappend windows $w
    }
    ::kelmartool::window::watch
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

    # Puts the redraw trace on the commands that exist and do not carry it yet.
    proc watch {} {
        variable watched
        foreach command $watched {
            if {[namespace which -command $command] eq {}} continue
            if {{leave ::kelmartool::window::changed} in [trace info execution $command]} continue
            trace add execution $command leave ::kelmartool::window::changed
        }
    }

    proc changed {args} { schedule }

    # One redraw in the next idle pass, whatever the number of changes before it.
    proc schedule {} {
        variable pending
        variable windows
        if {$pending ne {} || ![llength $windows]} return
        set pending [after idle ::kelmartool::window::redrawAll]
    }

    proc forget {w destroyed} {
        variable windows
        if {$destroyed ne $w} return
        set windows [lsearch -all -inline -exact -not $windows $w]
    }

    proc redrawAll {} {
        variable pending {}
        variable windows
        variable redraws
        incr redraws
        foreach w $windows { if {[winfo exists $w]} { redraw $w } }
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
        if {[catch {kelmartool::shown} rect] || [catch {kelmartool::scene} scene]} {
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
                    $c create rectangle {*}$xy -fill $fill -outline $outline -tags $tags
                    if {$label ne {} && $scale >= 24} {
                        lassign $xy ax ay bx by
                        $c create text [expr {($ax + $bx) / 2}] [expr {($ay + $by) / 2}] -text $label \
                            -font {Helvetica 8} -tags [list label label:$name]
                    }
                }
            }
        }
    }

    # The object under a canvas point: the topmost item's kind and name, {} when none.
    proc objectAt {w x y} {
        set c $w.c
        foreach id [lreverse [$c find overlapping $x $y $x $y]] {
            set kind {}
            set name {}
            foreach tag [$c gettags $id] {
                if {[string match kind:* $tag]} { set kind [string range $tag 5 end] }
                if {[string match name:* $tag]} { set name [string range $tag 5 end] }
            }
            if {$kind in {grid device density}} continue
            if {$name ne {}} { return [list $kind $name] }
        }
        return {}
    }

    proc hover {w x y} {
        lassign [objectAt $w $x $y] kind name
        if {$name eq {}} { $w.status configure -text {}; return }
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

    proc wheel {delta} {
        if {$delta > 0} { catch { ::kelmartool::view zoom -in } } elseif {$delta < 0} { catch { ::kelmartool::view zoom -out } }
    }
}
