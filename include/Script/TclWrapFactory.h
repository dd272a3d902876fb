// Script::TclWrapFactory: the registry of wrapper factories by interface identifier.
#pragma once

#include <tcl.h>

#include "CitI/ITclWrapFactory.h"

namespace Script {

class TclWrapFactory {
public:
    // Keeps `factory` under `interfaceId` for good; a later registration under the same identifier
    // replaces it.
    static bool RegisterFactory(const Port::XUID& interfaceId, CitI::ITclWrapFactory* factory);
    // What the factory registered under `id` makes of `object`; null without a factory.
    static CitI::IInterface* CreateInstance(const Port::XUID& id, CitI::IInterface* object, Tcl_Interp* interp);
};

}  // namespace Script
