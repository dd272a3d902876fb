// The native limit: one Tcl command whose procedure does what every wrapped call must do at least,
// take its argument's string, make one virtual call and set an empty result. Built with
// KELMAR_CALLGRIND, the extension also offers benchcount, the window of callgrind's counting.
#include <tcl.h>

#include <memory>

#include "sink.h"

#ifdef KELMAR_CALLGRIND
#include <valgrind/callgrind.h>
#endif

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

#ifdef KELMAR_CALLGRIND
// benchcount start | stop LABEL: start zeroes callgrind's counts and turns collection on; stop
// turns it off and dumps the counts into a file of their own, under LABEL. Outside valgrind both
// fail, so that a run without it cannot pass for a count.
int Count(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    static const char* const kWords[] = {"start", "stop", nullptr};
    static bool counting = false;
    int word = 0;
    if (objc < 2 || Tcl_GetIndexFromObj(interp, objv[1], kWords, "word", 0, &word) != TCL_OK ||
        objc != (word == 0 ? 2 : 3)) {
        Tcl_ResetResult(interp);
        Tcl_WrongNumArgs(interp, 1, objv, "start | stop LABEL");
        return TCL_ERROR;
    }
    if (!RUNNING_ON_VALGRIND) {
        Tcl_SetObjResult(interp, Tcl_NewStringObj("not running under valgrind --tool=callgrind", -1));
        return TCL_ERROR;
    }
    if (counting == (word == 0)) {
        Tcl_SetObjResult(interp, Tcl_NewStringObj(counting ? "already counting" : "not counting", -1));
        return TCL_ERROR;
    }
    counting = word == 0;
    if (counting) {
        CALLGRIND_ZERO_STATS;
        CALLGRIND_TOGGLE_COLLECT;
    } else {
        CALLGRIND_TOGGLE_COLLECT;
        CALLGRIND_DUMP_STATS_AT(Tcl_GetString(objv[2]));
    }
    return TCL_OK;
}
#endif

}  // namespace

extern "C" int Benchnative_Init(Tcl_Interp* interp) {
    auto sink = std::make_unique<Sink>();
    Tcl_CreateObjCommand(interp, "benchnative", &Take, sink.release(), &Delete);
#ifdef KELMAR_CALLGRIND
    Tcl_CreateObjCommand(interp, "benchcount", &Count, nullptr, nullptr);
#endif
    return Tcl_PkgProvide(interp, "benchnative", "1.0");
}
