#include "Script/Handle.h"

namespace Script {

void Handle::AddRefValue() {}

void Handle::ReleaseValue() {}

Handle::~Handle() = default;

int Handle::Execute(int argc, Handle* const* argv, Tcl_Interp* interp) {
    const char* word = argc > 0 && argv != nullptr && argv[0] != nullptr ? argv[0]->GetString() : nullptr;
    if (word == nullptr) word = GetString();
    if (interp != nullptr) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("handle \"%s\" is no command", word != nullptr ? word : ""));
    }
    return TCL_ERROR;
}

TclObjHandleBase::TclObjHandleBase() : m_obj(nullptr) {}

TclObjHandleBase::TclObjHandleBase(Tcl_Obj* obj) : m_obj(nullptr) { SetObj(obj); }

TclObjHandleBase::TclObjHandleBase(const TclObjHandleBase& other) : Handle(other), m_obj(nullptr) {
    SetObj(other.m_obj);
}

TclObjHandleBase& TclObjHandleBase::operator=(const TclObjHandleBase& other) {
    Handle::operator=(other);
    SetObj(other.m_obj);
    return *this;
}

TclObjHandleBase::~TclObjHandleBase() {
    if (m_obj != nullptr) Tcl_DecrRefCount(m_obj);
}

// Takes the new reference before dropping the old one, so that assigning a value to itself is safe.
void TclObjHandleBase::SetObj(Tcl_Obj* obj) {
    if (obj != nullptr) Tcl_IncrRefCount(obj);
    if (m_obj != nullptr) Tcl_DecrRefCount(m_obj);
    m_obj = obj;
}

// The members below read the value through GetTclObj, so that a derived handle that keeps its value
// elsewhere needs to replace only that.
const char* TclObjHandleBase::GetString() {
    Tcl_Obj* obj = GetTclObj();
    return obj != nullptr ? Tcl_GetString(obj) : nullptr;
}

void TclObjHandleBase::SetResult(Tcl_Interp* interp) {
    if (interp == nullptr) return;
    Tcl_Obj* obj = GetTclObj();
    if (obj != nullptr) {
        Tcl_SetObjResult(interp, obj);
    } else {
        Tcl_ResetResult(interp);
    }
}

void TclObjHandleBase::SetVariable(Tcl_Interp* interp, const char* name) {
    if (interp == nullptr || name == nullptr) return;
    Tcl_Obj* value = GetTclObj();
    if (value == nullptr) value = Tcl_NewObj();
    Tcl_IncrRefCount(value);
    Tcl_Obj* nameObj = Tcl_NewStringObj(name, -1);
    Tcl_IncrRefCount(nameObj);
    Tcl_ObjSetVar2(interp, nameObj, nullptr, value, TCL_LEAVE_ERR_MSG);
    Tcl_DecrRefCount(nameObj);
    Tcl_DecrRefCount(value);
}

Handle* TclObjHandleBase::NewHandle(Tcl_Interp* interp) { return new TclStringHandle("", interp); }

// Made on first use and never freed, like the shared handle of every handle type.
Handle* TclObjHandleBase::GetSharedHandle() {
    static TclObjHandleBase* shared = new TclObjHandleBase(Tcl_NewObj());
    return shared;
}

TclIntHandle::TclIntHandle(int value, Tcl_Interp*) { SetObj(Tcl_NewIntObj(value)); }

TclStringHandle::TclStringHandle(const char* text, Tcl_Interp*) {
    SetObj(Tcl_NewStringObj(text != nullptr ? text : "", -1));
}

}  // namespace Script
