// Entry of the scripting support (libKelmarPkg).
#pragma once

#include <tcl.h>

extern "C" {
// Brings the support up in an interpreter: the ::kelmar namespace and the support's own wrapper
// factories for CitI::IInterface and HdcI::IHDProject. Safe to call more than once. Gives TCL_OK.
int Kelmarpkg_Init(Tcl_Interp* interp);
}
