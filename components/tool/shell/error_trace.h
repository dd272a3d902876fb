// How kelmarsh tells a failed script: its message once, then the trace of where it failed.
#pragma once

#include <tcl.h>

#include <string>

namespace kelmarsh {

// errorInfo of the failure in `interp`. An error of the package puts its text into the result and
// adds it to errorInfo, which then begins with the text twice: the second is left out.
std::string ErrorTrace(Tcl_Interp* interp);

}  // namespace kelmarsh
