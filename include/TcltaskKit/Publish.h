// Handing an object to Tcl under one of its interfaces. The package registers one wrapper factory
// per interface when it is loaded (`package require TcltaskI_Morvane`); the wrapper it makes becomes
// an object command in the namespace ::kelmar, such as ::kelmar::ICollection7, which runs the
// interface's commands on the object. Deleting the command (`rename $word {}`) or the interpreter
// ends the wrapper and its reference.
#pragma once

#include <tcl.h>

#include "CitI/IScriptHandle.h"
#include "CommonI/RefCountPtr.h"
#include "Script/TclWrapFactory.h"

namespace TcltaskKit {

// Hands `object` to Tcl under the interface `id`: on success the object command's word is the
// interpreter's result and the answer is true. The wrapper takes a reference of its own; the one
// taken here for the call goes at the end, so that a new object (no reference yet) that cannot be
// handed over is deleted here. Handing the same object under the same interface again gives the
// word it has already. False, with the reason as the result, when `object` is null or no wrapper
// factory is registered for `id` (the package is not loaded, or `id` is no task interface).
inline bool HandToTcl(Tcl_Interp* interp, const Port::XUID& id, CitI::IInterface* object) {
    const CitI::MIInterface hold(object);
    CitI::IInterface* wrapped = object ? Script::TclWrapFactory::CreateInstance(id, object, interp) : nullptr;
    auto* handle = wrapped ? static_cast<CitI::IScriptHandle*>(wrapped->GetInterface(CitI::IScriptHandleID)) : nullptr;
    if (handle == nullptr || !handle->SetResult(interp)) {
        Tcl_SetObjResult(interp, Tcl_NewStringObj(object ? "no wrapper factory is registered for the interface: is "
                                                           "the package TcltaskI_Morvane loaded?"
                                                         : "there is no object to hand to Tcl",
                                                  -1));
        return false;
    }
    return true;
}

}  // namespace TcltaskKit
