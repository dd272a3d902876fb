// Small owners of Tcl resources, so that a handler's error, thrown as an exception, leaks nothing.
#pragma once

#include <tcl.h>

#include <utility>

#include "Script/TclObjRef.h"

namespace TestKit {

// One reference on a Tcl value.
using TclRef = Script::TclObjRef;

// The interpreter's result, return options and error state, put back when the guard goes.
class SavedInterpState {
public:
    explicit SavedInterpState(Tcl_Interp* interp) noexcept
        : m_interp(interp), m_state(Tcl_SaveInterpState(interp, TCL_OK)) {}
    SavedInterpState(const SavedInterpState&) = delete;
    SavedInterpState& operator=(const SavedInterpState&) = delete;
    ~SavedInterpState() { Tcl_RestoreInterpState(m_interp, m_state); }

private:
    Tcl_Interp* m_interp;
    Tcl_InterpState m_state;
};

}  // namespace TestKit
