// TcltaskI::IObject. Every operation gives 1 on success; the last two parameters are the out property
// (may stay null) and the failure text.
#pragma once

#include <cstdint>

#include "Port/StringBase.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskI {

inline constexpr Port::XUIDLiteral IObjectID{0x11e02ec8e0e4424cull, 0x84400b83bb204ce2ull};

class IObject : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IObjectID;
    static constexpr const char* NAME = "IObject";

    using Str = Port_String;
    using Prop = UtilI::MITclProperty;
    using List = UtilI::TclPropertyList;
    using Out = UtilI::MITclProperty;
    using Msg = Port_String;

    virtual CommonI::RESULT name(const Prop& object, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT type(const Prop& object, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT get(const Prop& object, const Str& property, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT properties(const Prop& object, bool descriptors, Out& result, Msg& message) = 0;
};

}  // namespace TcltaskI
