// Entry of the scripting support (libKelmarPkg).
#pragma once

#include <tcl.h>

extern "C" {
// Brings the support up in an interpreter: the library's table of Tcl functions (the support calls
// Tcl through the stub table of the interpreter's Tcl, so this comes before any other call into the
// library), the ::kelmar namespace and the support's own wrapper factories for CitI::IInterface and
// HdcI::IHDProject. Safe to call more than once. TCL_ERROR only when the interpreter's Tcl is not 8.6.
int Kelmarpkg_Init(Tcl_Interp* interp);
}
