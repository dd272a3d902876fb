// Script::HandleRegistry: the Tcl side of the pointer handles. It gives a handle its word and object
// command, finds the handle behind a word, and ends the handles the support owns.
//
// Ownership: a handle handed to Tcl belongs to its object command; deleting the command ends it
// (ReleaseValue, then the destructor). A handle handed over for a value that already has a word under
// the same handle class in the same interpreter is a duplicate: it gets the existing word and is ended
// once the outermost running object command returns, because its maker (a wrapper's helper, reached
// through counted pointers) still touches it until then.
//
// All of it runs on the interpreters' thread; there is no lock.
#pragma once

#include <tcl.h>

#include <string_view>

#include "Script/Handle.h"

namespace Script {

class HandleRegistry {
public:
    // The word of `handle` in `interp`, made on first hand-over; null with a message in `interp`
    // when the object command could not be made. The object stays owned by the handle.
    static Tcl_Obj* HandOver(PtrHandleBase* handle, Tcl_Interp* interp);

    // The handle registered under `word`, or null.
    static PtrHandleBase* Find(std::string_view word);

    // Brings the support up in `interp`: the ::kelmar namespace and the clean-up at its deletion.
    static void Attach(Tcl_Interp* interp);

    // Called by the destructor of a handle: drops whatever the registry knows of it, and its object
    // command when the handle goes by other means than the command's deletion.
    static void Forget(PtrHandleBase* handle);

    // Called when a registered handle was assigned a new value: the (value, class) key follows it.
    static void Rekey(PtrHandleBase* handle, void* oldValue);

    // Ends every handle waiting to be ended; for the end of the process.
    static void EndPending();

private:
    static int ObjectCommand(ClientData data, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]);
    static void CommandDeleted(ClientData data);
    static void InterpDeleted(ClientData data, Tcl_Interp* interp);
    static void ProcessExit(ClientData data);
    static std::string_view WordOf(const PtrHandleBase* handle);
};

}  // namespace Script
