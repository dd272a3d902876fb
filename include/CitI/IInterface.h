// CitI::IInterface: the root of every component interface.
#pragma once

#include "Port/XUID.h"

namespace CitI {

inline constexpr Port::XUIDLiteral IInterfaceID{0xc569a98287c54d45ull, 0x8a2c17b796723bdcull};

class IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IInterfaceID;
    static constexpr const char* NAME = "IInterface";

    // One of the object's interfaces, or null when it has none of that identifier. The answer
    // carries no new reference.
    virtual IInterface* GetInterface(const Port::XUID& id) = 0;
    virtual ~IInterface() = default;
};

}  // namespace CitI
