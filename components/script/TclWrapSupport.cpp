#include "Script/TclWrapSupport.h"

#include <string>

#include "CitI/IScriptHandle.h"
#include "Script/TclWrapFactory.h"

namespace Script {
namespace {

const char* DirectionName(int direction) {
    switch (direction) {
        case IN: return "an IN";
        case OUT: return "an OUT";
        case INOUT: return "an INOUT";
        case RESULT: return "a RESULT";
        default: return "an unknown";
    }
}

int Fail(Tcl_Interp* interp, Tcl_Obj* message) {
    Tcl_IncrRefCount(message);
    if (interp != nullptr) Tcl_SetObjResult(interp, message);
    Tcl_DecrRefCount(message);
    return 1;
}

// The value a Fetch reads: the handle's word for IN, the variable it names for INOUT. Null with the
// message in the interpreter when there is none.
Tcl_Obj* FetchSource(const char* operation, Tcl_Interp* interp, Handle* handle, int direction) {
    if (direction != IN && direction != INOUT) {
        Fail(interp, Tcl_ObjPrintf("%s was called for %s parameter, which it cannot read", operation,
                                   DirectionName(direction)));
        return nullptr;
    }
    Tcl_Obj* word = handle != nullptr ? handle->GetTclObj() : nullptr;
    if (word == nullptr) {
        Fail(interp, Tcl_ObjPrintf("%s was called for %s parameter, but the parameter is NULL", operation,
                                   DirectionName(direction)));
        return nullptr;
    }
    if (direction == IN) return word;
    if (interp == nullptr) return nullptr;  // no variables to read
    return Tcl_ObjGetVar2(interp, word, nullptr, TCL_LEAVE_ERR_MSG);
}

// Stores `value` (a new object, owned from here on) by direction: OUT into the variable the handle
// names, RESULT as the interpreter's result.
int StoreValue(const char* operation, Tcl_Interp* interp, Handle* handle, int direction, Tcl_Obj* value) {
    Tcl_IncrRefCount(value);
    int status = 1;
    if (interp == nullptr) {
        // Nowhere to store, and nowhere to say so: only the status tells.
    } else if (direction == RESULT) {
        Tcl_SetObjResult(interp, value);
        status = 0;
    } else if (direction != OUT) {
        Fail(interp, Tcl_ObjPrintf("%s was called for %s parameter, which it cannot write", operation,
                                   DirectionName(direction)));
    } else if (Tcl_Obj* name = handle != nullptr ? handle->GetTclObj() : nullptr; name == nullptr) {
        Fail(interp, Tcl_ObjPrintf("%s was called for an OUT parameter, but the variable is NULL", operation));
    } else if (Tcl_ObjSetVar2(interp, name, nullptr, value, TCL_LEAVE_ERR_MSG) != nullptr) {
        status = 0;
    }
    Tcl_DecrRefCount(value);
    return status;
}

}  // namespace

int TclWrapSupport::FetchString(Port::StringBase<char>& value, Tcl_Interp* interp, Handle* handle, int direction) {
    Tcl_Obj* source = FetchSource("FetchString", interp, handle, direction);
    if (source == nullptr) return 1;
    int length = 0;
    const char* text = Tcl_GetStringFromObj(source, &length);
    value = Port::StringBase<char>(text, length);
    return 0;
}

int TclWrapSupport::FetchBool(bool& value, Tcl_Interp* interp, Handle* handle, int direction) {
    Tcl_Obj* source = FetchSource("FetchBool", interp, handle, direction);
    int flag = 0;
    if (source == nullptr || Tcl_GetBooleanFromObj(interp, source, &flag) != TCL_OK) return 1;
    value = flag != 0;
    return 0;
}

int TclWrapSupport::FetchInt32(int32_t& value, Tcl_Interp* interp, Handle* handle, int direction) {
    Tcl_Obj* source = FetchSource("FetchInt32", interp, handle, direction);
    int number = 0;
    if (source == nullptr || Tcl_GetIntFromObj(interp, source, &number) != TCL_OK) return 1;
    value = number;
    return 0;
}

int TclWrapSupport::FetchGuid(Port::XUID& value, Tcl_Interp*, Handle* handle, int) {
    const char* text = handle != nullptr ? handle->GetString() : nullptr;
    value = text != nullptr ? Port::XUID(text) : Port::XUID();
    return 0;
}

int TclWrapSupport::StoreString(const Port::StringBase<char>& value, Tcl_Interp* interp, Handle* handle, int direction) {
    return StoreValue("StoreString", interp, handle, direction, Tcl_NewStringObj(value.c_str(), value.Length()));
}

int TclWrapSupport::StoreInt64(int64_t value, Tcl_Interp* interp, Handle* handle, int direction) {
    return StoreValue("StoreInt64", interp, handle, direction, Tcl_NewWideIntObj(static_cast<Tcl_WideInt>(value)));
}

int TclWrapSupport::CreateVariables(Tcl_Interp* interp, TclWrapIDEntry* table) {
    if (table == nullptr) return 0;
    if (interp == nullptr) return 1;
    int status = 0;
    for (const TclWrapIDEntry* row = table; !row->variableName.IsEmpty(); ++row) {
        if (row->identifierFunction == nullptr) {
            status = Fail(interp, Tcl_ObjPrintf("no identifier for the variable \"%s\"", row->variableName.c_str()));
            continue;
        }
        // The row's function builds the identifier in place, as every identifier literal is built.
        alignas(Port::XUID) unsigned char storage[sizeof(Port::XUID)];
        Port::XUID* id = row->identifierFunction(reinterpret_cast<Port::XUID*>(storage));
        const Port::StringBase<char> text = id->ToString();
        id->~XUID();

        // Names are taken from the global namespace, whatever namespace the caller runs in.
        std::string space = row->namespaceName.c_str();
        if (space.compare(0, 2, "::") != 0) space.insert(0, "::");
        if (space != "::" && Tcl_FindNamespace(interp, space.c_str(), nullptr, TCL_GLOBAL_ONLY) == nullptr &&
            Tcl_CreateNamespace(interp, space.c_str(), nullptr, nullptr) == nullptr) {
            status = 1;
            continue;
        }
        if (space == "::") space.clear();
        const std::string name = space + "::" + row->variableName.c_str();
        Tcl_Obj* valueObj = Tcl_NewStringObj(text.c_str(), text.Length());
        Tcl_IncrRefCount(valueObj);
        if (Tcl_SetVar2Ex(interp, name.c_str(), nullptr, valueObj, TCL_LEAVE_ERR_MSG) == nullptr) status = 1;
        Tcl_DecrRefCount(valueObj);
    }
    return status;
}

int TclWrapSupport::TclWrapResolver(Port::XUID id, CitI::IInterface* object, Tcl_Interp* interp) {
    if (interp == nullptr) return TCL_ERROR;
    if (object == nullptr) {
        Tcl_SetObjResult(interp, Tcl_NewIntObj(0));
        return TCL_OK;
    }
    CitI::IInterface* wrapper = TclWrapFactory::CreateInstance(id, object, interp);
    if (wrapper == nullptr) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("no wrapper for interface %s", id.ToString().c_str()));
        return TCL_ERROR;
    }
    auto* scriptHandle = static_cast<CitI::IScriptHandle*>(wrapper->GetInterface(CitI::IScriptHandleID));
    if (scriptHandle == nullptr || !scriptHandle->SetResult(interp)) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("the wrapper for interface %s has no handle", id.ToString().c_str()));
        return TCL_ERROR;
    }
    return TCL_OK;
}

}  // namespace Script
