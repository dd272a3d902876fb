// The native limit: one Tcl command whose procedure does what every wrapped call must do at least,
// take its argument's string, make one virtual call and set an empty result.
#include <tcl.h>

#include <memory>

#include "sink.h"

namespace {

int Take(ClientData data, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc != 2) {
        Tcl_WrongNumArgs(interp, 1, objv, "word");
        return TCL_ERROR;
    }
    static_cast<Sink*>(data)->Take(Tcl_GetString(objv[1]));
    Tcl_ResetResult(interp);
    return TCL_OK;
}

void Delete(ClientData data) { delete static_cast<Sink*>(data); }

}  // namespace

extern "C" int Benchnative_Init(Tcl_Interp* interp) {
    auto sink = std::make_unique<Sink>();
    Tcl_CreateObjCommand(interp, "benchnative", &Take, sink.release(), &Delete);
    return Tcl_PkgProvide(interp, "benchnative", "1.0");
}
