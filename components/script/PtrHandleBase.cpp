#include "HandleRegistry.h"
#include "Script/Handle.h"

namespace Script {

PtrHandleBase::PtrHandleBase() : PtrHandleBase(nullptr, nullptr) {}

PtrHandleBase::PtrHandleBase(Tcl_Interp* interp) : PtrHandleBase(nullptr, interp) {}

PtrHandleBase::PtrHandleBase(void* value, Tcl_Interp* interp)
    : m_value(value), m_interp(interp), m_typeName(nullptr), m_word(nullptr) {}

// A copy is a handle of its own: the word, and with it the object command, stay with the original.
PtrHandleBase::PtrHandleBase(const PtrHandleBase& other)
    : Handle(other),
      m_value(other.m_value),
      m_interp(other.m_interp),
      m_typeName(other.m_typeName),
      m_identity(other.m_identity),
      m_word(nullptr) {}

PtrHandleBase& PtrHandleBase::operator=(const PtrHandleBase& other) {
    if (this == &other) return *this;
    void* oldValue = m_value;
    Handle::operator=(other);
    m_value = other.m_value;
    m_interp = other.m_interp;
    m_typeName = other.m_typeName;
    HandleRegistry::Rekey(this, oldValue);
    return *this;
}

PtrHandleBase::~PtrHandleBase() {
    HandleRegistry::Forget(this);
    if (m_word != nullptr) Tcl_DecrRefCount(m_word);
}

int PtrHandleBase::GetValue(void** out) const {
    if (out != nullptr) *out = m_value;
    return m_value != nullptr ? 0 : 1;
}

PtrHandleBase* PtrHandleBase::GetHandleFromTclObj(Tcl_Obj* obj) {
    if (obj == nullptr) return nullptr;
    int length = 0;
    const char* text = Tcl_GetStringFromObj(obj, &length);
    return HandleRegistry::Find({text, static_cast<size_t>(length)});
}

Tcl_Obj* PtrHandleBase::GetTclObj() { return m_word; }

const char* PtrHandleBase::GetString() { return m_word != nullptr ? Tcl_GetString(m_word) : nullptr; }

void PtrHandleBase::SetResult(Tcl_Interp* interp) {
    Tcl_Obj* word = HandleRegistry::HandOver(this, interp);
    if (word != nullptr) Tcl_SetObjResult(interp, word);
}

void PtrHandleBase::SetVariable(Tcl_Interp* interp, const char* name) {
    Tcl_Obj* word = HandleRegistry::HandOver(this, interp);
    if (word == nullptr || name == nullptr) return;
    Tcl_Obj* nameObj = Tcl_NewStringObj(name, -1);
    Tcl_IncrRefCount(nameObj);
    Tcl_ObjSetVar2(interp, nameObj, nullptr, word, TCL_LEAVE_ERR_MSG);
    Tcl_DecrRefCount(nameObj);
}

}  // namespace Script
