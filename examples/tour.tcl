# A walk through every interface of the Kelmar tool on the sample design.
#
#   kelmarsh -project examples/designs/counter.json examples/tour.tcl
#
# Each step prints the command and what it answered. Nothing in examples/ is changed: the steps
# that write files work on copies in a temporary folder.

if {[project GetFileName] eq ""} {
    puts stderr "usage: kelmarsh -project DESIGN.json [info script]"
    exit 1
}

# Runs a command in the caller's frame and prints it with its answer; an error is printed as such.
proc step {command} {
    puts "% $command"
    if {[catch {uplevel 1 $command} answer]} {
        puts "  error: [join [split $answer \n] "\n  "]"
    } elseif {$answer ne ""} {
        foreach line [split $answer \n] { puts "  $line" }
    }
}

proc section {title} { puts "\n== $title" }

set design [file tail [project GetFileName]]
set scratch [file join [expr {[info exists ::env(TMPDIR)] ? $::env(TMPDIR) : "/tmp"}] kelmar-tour-[pid]]
file mkdir $scratch

section "Project ($design)"
# The file's full path depends on the checkout; its last part does not.
step {file tail [project GetFileName]}
step {set hd [project GetHDProject]}
step {file tail [[$hd GetInterface $::kelmar::TcltaskI::ITclProjectID] GetFileName]}
# Any object can be kept on a project; here the object query, as a plain interface.
set ::IInterfaceID c569a982-87c5-4d45-8a2c-17b796723bdc
step {set query [obj GetInterface $::IInterfaceID]}
step {project RegisterComponent 5d1e4b7a-2c3f-4e8a-9b6d-0f1a2b3c4d5e query}
step {project GetComponent 5d1e4b7a-2c3f-4e8a-9b6d-0f1a2b3c4d5e}
step {project UnRegisterComponent query}
step {projmgr GetCurrentTclProject current msg}
step {set msg}
set copy [file join $scratch copy.json]
file copy -force [project GetFileName] $copy
step {projmgr Open $copy msg}
step {set msg}
step {project Sync msg}
step {set msg}
step {projmgr Close $copy msg}
step {project GetFileName}
step {projmgr Open no-such-file.json msg}
step {set msg}

section "Object queries"
step {obj type r0}
step {obj get r0 cell_type}
step {obj get q0_n loads}
step {kelmartool::report dict [obj properties sys_clk]}
step {lindex [obj properties u_inc0 -descriptors] 0}
step {obj get nosuch site}

section "Global settings"
step {kelmartool::report dict [settings properties]}
step {settings set max_paths 3}
step {settings set max_paths many}
step {settings set my_note "set by the tour"}
step {settings unset max_paths}

section "Collections"
step {collection append_to regs r0 r1}
step {collection append_to logic u_inc0 u_inc1 u_carry}
step {collection append_to regs r1 clkbuf -unique}
step {collection sizeof regs}
step {collection index logic 2}
step {collection index logic -1}
step {collection equal regs {clkbuf r1 r0}}
step {collection equal regs {clkbuf r1 r0} -order_dependent}
step {collection remove_from regs clkbuf}
step {collection foreach cell logic { puts "    $cell on [obj get $cell site]" }}
step {collection set outputs {q0 q1 carry}}
step {collection properties}

section "Search"
step {search search u_*}
step {search search Q* -type port}
step {search search Q* -type port -matchcase}
step {search search {^r[0-9]$} -regexp}
step {search search clk -exactmatch -type net}
step {search search * -in logic}

section "Selection"
step {selection new r0 r1}
step {selection add outputs}
step {selection remove q1}
step {selection set filter cell}
step {selection add q1}
step {selection set filter all}
step {selection current}

section "Highlight"
step {highlight get default_highlight_color}
step {highlight add r0 r1}
step {highlight add q0_n -color #ff8800}
step {highlight new logic -color green}
step {highlight add r0 -color mauve}
step {highlight set default_highlight_color cyan}
step {highlight add carry}
step {highlight current}
step {highlight remove carry}
step {highlight clear}

section "Graphical view"
step {view zoom -full}
step {view zoom -selection}
step {view zoom -out}
step {view zoom -in}
step {view pan -right -percentage 25}
step {view zoom -name bank_east}
step {view zoom -range {2 2 6 6}}
step {view pan -up}
step {view previous}
step {view previous}
step {view next}
step {view pan -farleft -top}

section "Timing analysis"
step {timing new setup -name "counter at 100 MHz"}
step {kelmartool::report paths [timing run setup]}
step {timing get setup worst_slack}
step {timing set_constraint setup period:sys_clk 4.5}
step {kelmartool::report paths [timing run setup -overwrite]}
step {timing get setup worst_slack}
step {timing get setup failing}
step {timing save_as setup [file join $scratch setup.rpt]}
step {timing show_settings setup}
step {timing delete setup}

section "Floorplan"
step {floorplan open}
step {floorplan block_properties}
step {floorplan group blk_out {u_carry}}
step {floorplan block_set_constraint blk_out region X4Y4:X4Y4}
step {floorplan prohibit {X4Y4}}
step {kelmartool::report drc [floorplan drc]}
step {floorplan allow {X4Y4}}
step {floorplan drc}
step {kelmartool::report sso [floorplan sso_analysis]}
step {kelmartool::report clocks [floorplan clock_analysis]}
step {floorplan export -csv [file join $scratch plan.csv]}
step {floorplan close -nosave}

section "Help"
step {collection index regs 0 extra}
step {selection current extra}
step {timing new a b}

file delete -force $scratch
puts "\nTour done."
