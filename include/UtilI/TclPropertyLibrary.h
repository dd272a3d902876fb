// Entry of the property component's library (libTcltask_Support).
#pragma once

#include <tcl.h>

extern "C" {
// Sets the library's table of Tcl functions from the interpreter's Tcl. The property component
// calls Tcl, but has no interpreter of its own to ask: whoever loads the library for use with Tcl
// calls this once with an interpreter (the package's entry does) before a property holds a value.
// Safe to call again, from any interpreter of the same Tcl. TCL_ERROR when that Tcl is not 8.6.
int Tcltask_support_Init(Tcl_Interp* interp);
}
