// Script::HandleRegistry: the Tcl side of the pointer handles. It gives a handle its word and object
// command, finds the handle behind a word, follows a command that `rename` moved (at hand-over, and
// when the command is called by its new name), and ends the handles the support owns.
//
// Ownership: a handle handed to Tcl belongs to its object command; deleting the command ends it
// (ReleaseValue, then the destructor). A handle handed over for a value that already has a word under
// the same handle class in the same interpreter is a duplicate: it gets the existing word and is ended
// once the outermost running object command returns, because its maker (a wrapper's helper, reached
// through counted pointers) still touches it until then.
//
// Threads: Tcl runs an interpreter on one thread only, and a word is a command of one interpreter, so
// each thread keeps a registry of its own and no lock is needed. Words are unique in the process.
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

    // The handle registered under `word` on this thread, or null.
    static PtrHandleBase* Find(std::string_view word);

    // Brings the support up in `interp`: the ::kelmar namespace and the clean-up at its deletion.
    static void Attach(Tcl_Interp* interp);

    // Called by the destructor of a handle: drops whatever the registry knows of it, and its object
    // command when the handle goes by other means than the command's deletion.
    static void Forget(PtrHandleBase* handle);

    // Called when a registered handle was assigned a new value: the (value, class) key follows it.
    static void Rekey(PtrHandleBase* handle, void* oldValue);

    // Ends every handle of this thread waiting to be ended.
    static void EndPending();

private:
    static int ObjectCommand(ClientData data, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]);
    static void CommandDeleted(ClientData data);
    static void Follow(PtrHandleBase* handle);
    static void InterpDeleted(ClientData data, Tcl_Interp* interp);
    static void SetWord(PtrHandleBase* handle, Tcl_Obj* word);
};

}  // namespace Script
