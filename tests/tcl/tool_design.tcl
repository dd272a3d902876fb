# Shared by the tool tests: a small design written into a temporary file, and a clean slate.
# The tests call the roots by their words, as in kelmarsh.
package require KelmarTool
namespace import ::kelmartool::*

namespace eval tooltest {
    variable files {}

    # The small design: a 6x4 device with one bank on each side, two flip-flops, two LUTs and
    # three ports; names chosen so that searches have a handful of hits.
    variable small {{
      "design": "small",
      "device": { "name": "KT-24", "columns": 6, "rows": 4,
                  "banks": [ { "name": "west", "sites": "X0Y0:X0Y3", "sso_limit": 1 },
                             { "name": "east", "sites": "X5Y0:X5Y3", "sso_limit": 2 } ] },
      "clocks": [ { "name": "clk", "period": 8, "net": "ck" } ],
      "ports": [ { "name": "din", "direction": "in", "site": "X0Y1" },
                 { "name": "ckin", "direction": "in", "site": "X0Y2" },
                 { "name": "dout", "direction": "out", "site": "X5Y1", "standard": "LVCMOS18" } ],
      "cells": [ { "name": "ckbuf", "type": "BUFG", "site": "X1Y2", "delay": 0.5 },
                 { "name": "ff_a", "type": "FF", "site": "X2Y1", "delay": 0.5, "setup": 0.25, "clock": "clk" },
                 { "name": "ff_b", "type": "FF", "site": "X4Y1", "delay": 0.5, "setup": 0.25, "clock": "clk" },
                 { "name": "lut_x", "type": "LUT", "site": "X3Y1", "delay": 1.5,
                   "properties": { "init": "0x8" } },
                 { "name": "lut_y", "type": "LUT", "delay": 1 } ],
      "nets": [ { "name": "ckpad", "driver": "ckin", "loads": ["ckbuf"], "delay": 0.25 },
                { "name": "ck", "driver": "ckbuf", "loads": ["ff_a", "ff_b"], "delay": 0.5 },
                { "name": "n_din", "driver": "din", "loads": ["ff_a"], "delay": 1 },
                { "name": "n_a", "driver": "ff_a", "loads": ["lut_x", "lut_y"], "delay": 0.75 },
                { "name": "n_x", "driver": "lut_x", "loads": ["ff_b"], "delay": 0.5 },
                { "name": "n_b", "driver": "ff_b", "loads": ["dout"], "delay": 2 } ],
      "properties": { "owner": "tests" }
    }}

    # Writes `text` into a new temporary file and gives its name.
    proc write {text {suffix .json}} {
        variable files
        set channel [file tempfile name kelmartool$suffix]
        puts -nonewline $channel $text
        close $channel
        lappend files $name
        return $name
    }

    # Closes every open project and forgets collections, selection and highlight with them.
    proc reset {} {
        while {[projmgr CloseCurrent msg] == 1} {}
        highlight set default_highlight_color yellow
        selection set filter all
        foreach name [dict keys [settings properties]] { settings unset $name }
    }

    # A fresh small project as the only open one; gives its file.
    proc open_small {} {
        variable small
        reset
        set file [write $small]
        if {[projmgr Open $file msg] != 1} { error $msg }
        return $file
    }

    # The message of a command that must fail with TCL_ERROR; an error of its own when it does not.
    proc failure {script} {
        if {[catch {uplevel 1 $script} message] != 1} { error "no failure from: $script" }
        return $message
    }

    proc cleanup {} {
        variable files
        reset
        foreach file $files { file delete -force $file $file.tmp }
        set files {}
    }
}
