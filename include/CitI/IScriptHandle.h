// CitI::IScriptHandle: what a Tcl handle shows to component code.
#pragma once

#include <tcl.h>

#include "CitI/IInterface.h"

namespace Script {
class Handle;
}

namespace CitI {

inline constexpr Port::XUIDLiteral IScriptHandleID{0xfa2daa9c8c504252ull, 0xbd75c29cac5bd9e8ull};

class IScriptHandle : public IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IScriptHandleID;
    static constexpr const char* NAME = "IScriptHandle";

    // The handle's word becomes the interpreter's result; false without a handle.
    virtual bool SetResult(Tcl_Interp* interp) = 0;
    // The handle's word becomes the value of the variable `name`; false without a handle.
    virtual bool SetVariable(Tcl_Interp* interp, const char* name) = 0;
    virtual Script::Handle* GetHandle() = 0;
    virtual bool SetHandle(Script::Handle* handle) = 0;
};

}  // namespace CitI
