// CitI::ITclWrapFactory: makes the Tcl wrapper of an object under one interface identifier.
#pragma once

#include <tcl.h>

#include "CitI/IInterface.h"

namespace CitI {

inline constexpr Port::XUIDLiteral ITclWrapFactoryID{0x61b04850d1384a3cull, 0x8eaf9cbcd78d1625ull};

class ITclWrapFactory : public IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = ITclWrapFactoryID;
    static constexpr const char* NAME = "ITclWrapFactory";

    // A new wrapper of `object` under `id`, given as its IScriptHandle helper; null when `id` is not
    // this factory's interface or `object` is null.
    virtual IInterface* CreateInstance(const Port::XUID& id, IInterface* object, Tcl_Interp* interp) = 0;
};

}  // namespace CitI
