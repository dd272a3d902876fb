// Script::TTclWrapFactory<W,I>: the factory of wrapper class W for interface I. It has no data.
#pragma once

#include "CitI/ITclWrapFactory.h"

namespace Script {

template <class W, class I>
class TTclWrapFactory final : public CitI::ITclWrapFactory {
public:
    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        if (id == CitI::IInterfaceID || id == CitI::ITclWrapFactoryID) return this;
        return nullptr;
    }

    CitI::IInterface* CreateInstance(const Port::XUID& id, CitI::IInterface* object, Tcl_Interp* interp) override {
        if (!(id == I::IID) || object == nullptr) return nullptr;
        auto* face = static_cast<I*>(object->GetInterface(I::IID));
        W* wrapper = new W(face, interp);
        return wrapper->GetScriptHandle(CitI::IInterfaceID);
    }
};

}  // namespace Script
