// Fetch and Store of object values by direction. Plain values (strings, bools, integers,
// identifiers) go through Script::TclWrapSupport; objects go through these templates. Every one takes
// (value, interpreter, handle, direction), gives 0 on success, and on failure has reported by
// itself (report without reset). The directions no call site uses carry their own failure texts.
#pragma once

#include <tcl.h>

#include "CitI/IScriptHandle.h"
#include "CommonI/RefCountPtr.h"
#include "Script/Handle.h"
#include "Script/TclWrapFactory.h"
#include "UtilI/ITclProperty.h"
#include "package/report.h"

namespace TcltaskI {

namespace detail {

// The integer 0 and the word NULL stand for a null object.
inline bool IsNullWord(Script::Handle* handle) {
    int value = 0;
    if (Tcl_GetIntFromObj(nullptr, handle->GetTclObj(), &value) == TCL_OK && value == 0) return true;
    return Port_String(handle->GetString()).Compare("NULL", Port::CompareNoCase) == 0;
}

// The pointer held by a handle of type PtrHandle<T>, or null.
template <class T>
T* PointerOf(Script::Handle* handle) {
    auto* typed = dynamic_cast<Script::PtrHandle<T>*>(handle);
    void* value = nullptr;
    if (typed == nullptr || typed->GetValue(&value) != 0) return nullptr;
    return static_cast<T*>(value);
}

// The value of the variable that the handle's word names; null (with Tcl's message) when none.
inline Tcl_Obj* VariableOf(Tcl_Interp* interp, Script::Handle* handle) {
    return Tcl_GetVar2Ex(interp, Tcl_GetString(handle->GetTclObj()), nullptr, TCL_LEAVE_ERR_MSG);
}

// Hands a helper's handle to Tcl as the result or as a variable.
inline void HandOver(CitI::IScriptHandle* script, Tcl_Interp* interp, Script::Handle* handle, int direction) {
    if (direction == Script::OUT) script->SetVariable(interp, handle->GetString());
    else script->SetResult(interp);
}

// The integer 0 as the result or as a variable: how Tcl sees a null object.
inline void StoreNull(Tcl_Interp* interp, Script::Handle* handle, int direction) {
    Script::TclIntHandle zero(0, nullptr);
    if (direction == Script::OUT) zero.SetVariable(interp, handle->GetString());
    else zero.SetResult(interp);
}

}  // namespace detail

// A plain, uncounted pointer from a handle of PtrHandle<T>; 0 and NULL give a null pointer.
template <class T>
int Fetch_Type(T*& value, Tcl_Interp* interp, Script::Handle* handle, int direction) {
    switch (direction) {
    case Script::IN:
        if (detail::IsNullWord(handle)) {
            value = nullptr;
            return 0;
        }
        value = detail::PointerOf<T>(handle);
        if (value != nullptr) return 0;
        return ReportWithoutReset(interp, "Unable to fetch an object from parameter");
    case Script::OUT:
        return ReportWithoutReset(interp, "Tetch_Type was called for an OUT parameter, which indicates a failure.");
    default:
        return ReportWithoutReset(interp, "Fetch_Type was called for a RESULT, which indicates a failure.");
    }
}

// A counted pointer from a handle of PtrHandle<T> (IN) or from the variable its word names (INOUT).
template <class T>
int Fetch_InterfaceType(CommonI::RefCountPtr<T>& value, Tcl_Interp* interp, Script::Handle* handle, int direction) {
    switch (direction) {
    case Script::IN:
        if (detail::IsNullWord(handle)) {
            value = nullptr;
            return 0;
        }
        if (T* object = detail::PointerOf<T>(handle)) {
            value = CommonI::RefCountPtr<T>(object);
            return 0;
        }
        return ReportWithoutReset(interp, "Unable to fetch an object of Interface type from parameter");
    case Script::OUT:
        return ReportWithoutReset(interp, "Fetch_InterfaceType was called for an OUT parameter, which indicates a failure.");
    case Script::INOUT: {
        Tcl_Obj* variable = detail::VariableOf(interp, handle);
        Script::PtrHandleBase* held = variable ? Script::PtrHandleBase::GetHandleFromTclObj(variable) : nullptr;
        if (held == nullptr) {
            value = nullptr;
            return 0;
        }
        if (T* object = detail::PointerOf<T>(held)) {
            value = CommonI::RefCountPtr<T>(object);
            return 0;
        }
        return ReportWithoutReset(interp, Port_String("Unable to fetch an object of type ", T::NAME, " from parameter"));
    }
    default:
        return ReportWithoutReset(interp, "Fetch_InterfaceType was called for a RESULT, which indicates a failure");
    }
}

// A property made from the word (IN) or from the variable it names (INOUT): one new component per
// value. A missing variable gives a null property and success, with Tcl's message left behind.
template <>
int Fetch_InterfaceType<UtilI::ITclProperty>(UtilI::MITclProperty& value, Tcl_Interp* interp,
                                             Script::Handle* handle, int direction);

// A plain pointer as a new PtrHandle<T> that Tcl then owns; null as the integer 0. The pointer
// carries no reference, so the handle takes one of its own where the object is counted: a word that
// outlives the object it was handed out for would otherwise reach freed memory.
template <class T>
int Store_Type(T* value, Tcl_Interp* interp, Script::Handle* handle, int direction) {
    if (direction == Script::IN)
        return ReportWithoutReset(interp, "Store_Type was called for an IN parameter, which  indicates a failure.");
    if (direction == Script::OUT && handle == nullptr)
        return ReportWithoutReset(interp, "Store_Type was called for an OUT parameter, but the variable is NULL");
    if (value == nullptr) {
        detail::StoreNull(interp, handle, direction);
        return 0;
    }
    auto* held = new Script::CountedPtrHandle<T>(value, interp);
    if (direction == Script::OUT) held->SetVariable(interp, handle->GetString());
    else held->SetResult(interp);
    return 0;
}

// A counted object as the word of a new wrapper made by the factory of T's identifier; null as 0.
template <class T>
int Store_InterfaceType(const CommonI::RefCountPtr<T>& value, Tcl_Interp* interp, Script::Handle* handle,
                        int direction) {
    if (direction == Script::IN)
        return ReportWithoutReset(interp, "Store_InterfaceType was called for an IN parameter, which  indicates a failure.");
    if (direction == Script::OUT && handle == nullptr)
        return ReportWithoutReset(interp, "Store_InterfaceType was called for an OUT parameter, but the variable is NULL");
    if (!value) {
        detail::StoreNull(interp, handle, direction);
        return 0;
    }
    // The factory gives the wrapper's helper, which counts nothing: attached without a reference.
    CitI::MIInterface made;
    made.Attach(Script::TclWrapFactory::CreateInstance(T::IID, value.get(), interp));
    CitI::IScriptHandle* script =
        made ? static_cast<CitI::IScriptHandle*>(made->GetInterface(CitI::IScriptHandleID)) : nullptr;
    if (script == nullptr)
        return ReportWithoutReset(interp, "Store_InterfaceType was called for a type that does not exist in Script::TclWrapFactory");
    detail::HandOver(script, interp, handle, direction);
    return 0;
}

}  // namespace TcltaskI
