// Small owners of Tcl resources, so that a handler's error, thrown as an exception, leaks nothing.
#pragma once

#include <tcl.h>

#include <utility>

namespace TestKit {

// One reference on a Tcl value.
class TclRef {
public:
    TclRef() noexcept = default;
    explicit TclRef(Tcl_Obj* obj) noexcept : m_obj(obj) {
        if (m_obj) Tcl_IncrRefCount(m_obj);
    }
    TclRef(const TclRef& other) noexcept : TclRef(other.m_obj) {}
    TclRef(TclRef&& other) noexcept : m_obj(std::exchange(other.m_obj, nullptr)) {}
    TclRef& operator=(TclRef other) noexcept {
        std::swap(m_obj, other.m_obj);
        return *this;
    }
    ~TclRef() {
        if (m_obj) Tcl_DecrRefCount(m_obj);
    }

    Tcl_Obj* get() const noexcept { return m_obj; }
    explicit operator bool() const noexcept { return m_obj != nullptr; }

private:
    Tcl_Obj* m_obj = nullptr;
};

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
