#include "shell/error_trace.h"

namespace kelmarsh {

std::string ErrorTrace(Tcl_Interp* interp) {
    const std::string message = Tcl_GetStringResult(interp);
    const char* info = Tcl_GetVar2(interp, "errorInfo", nullptr, TCL_GLOBAL_ONLY);
    std::string trace = info != nullptr ? info : message;
    if (!message.empty() && trace.compare(0, 2 * message.size(), message + message) == 0) trace.erase(0, message.size());
    return trace;
}

}  // namespace kelmarsh
