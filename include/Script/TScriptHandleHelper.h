// Script::TScriptHandleHelper<W>: the IScriptHandle face of a wrapper, with a back pointer to it.
// It is never counted: it does not answer CommonI::IRefCount.
#pragma once

#include "CitI/IScriptHandle.h"
#include "Script/Handle.h"

namespace Script {

template <class W>
class TScriptHandleHelper final : public CitI::IScriptHandle {
public:
    TScriptHandleHelper() noexcept = default;

    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        if (m_handle != nullptr) return static_cast<W*>(m_handle)->GetScriptHandle(id);
        if (id == CitI::IScriptHandleID || id == CitI::IInterfaceID) return this;
        return nullptr;
    }
    bool SetResult(Tcl_Interp* interp) override {
        if (m_handle == nullptr) return false;
        m_handle->SetResult(interp);
        return true;
    }
    bool SetVariable(Tcl_Interp* interp, const char* name) override {
        if (m_handle == nullptr) return false;
        m_handle->SetVariable(interp, name);
        return true;
    }
    Handle* GetHandle() override { return m_handle; }
    bool SetHandle(Handle* handle) override {
        m_handle = handle;
        return true;
    }

private:
    Handle* m_handle = nullptr;
};

}  // namespace Script
