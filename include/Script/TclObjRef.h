// Script::TclObjRef: one reference on a Tcl value, held for as long as the owner lives, so that no
// way out of a function (an early return, an exception) leaks or frees a value too soon.
#pragma once

#include <tcl.h>

#include <string>
#include <utility>

namespace Script {

class TclObjRef {
public:
    TclObjRef() noexcept = default;
    explicit TclObjRef(Tcl_Obj* obj) noexcept : m_obj(obj) {
        if (m_obj != nullptr) Tcl_IncrRefCount(m_obj);
    }
    TclObjRef(const TclObjRef& other) noexcept : TclObjRef(other.m_obj) {}
    TclObjRef(TclObjRef&& other) noexcept : m_obj(std::exchange(other.m_obj, nullptr)) {}
    TclObjRef& operator=(TclObjRef other) noexcept {
        std::swap(m_obj, other.m_obj);
        return *this;
    }
    ~TclObjRef() {
        if (m_obj != nullptr) Tcl_DecrRefCount(m_obj);
    }

    Tcl_Obj* get() const noexcept { return m_obj; }
    explicit operator bool() const noexcept { return m_obj != nullptr; }

    // The value's text, every byte of it; empty for no value.
    std::string Text() const {
        if (m_obj == nullptr) return {};
        int length = 0;
        const char* text = Tcl_GetStringFromObj(m_obj, &length);
        return std::string(text, static_cast<std::size_t>(length));
    }

private:
    Tcl_Obj* m_obj = nullptr;
};

}  // namespace Script
