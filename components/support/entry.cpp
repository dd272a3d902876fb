// The library's entry for Tcl: it reaches Tcl through the stub table of the Tcl that loaded it.
#include "UtilI/TclPropertyLibrary.h"

extern "C" __attribute__((visibility("default"))) int Tcltask_support_Init(Tcl_Interp* interp) {
    return Tcl_InitStubs(interp, "8.6", 0) != nullptr ? TCL_OK : TCL_ERROR;
}
