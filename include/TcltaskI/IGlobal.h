// TcltaskI::IGlobal. Every operation gives 1 on success; the last two parameters are the out property
// (may stay null) and the failure text.
#pragma once

#include <cstdint>

#include "Port/StringBase.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskI {

inline constexpr Port::XUIDLiteral IGlobalID{0x14fe4ab68fa14f4full, 0x9adbdfee96d726d8ull};

class IGlobal : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IGlobalID;
    static constexpr const char* NAME = "IGlobal";

    using Str = Port_String;
    using Prop = UtilI::MITclProperty;
    using List = UtilI::TclPropertyList;
    using Out = UtilI::MITclProperty;
    using Msg = Port_String;

    virtual CommonI::RESULT set(const Str& name, const Prop& value, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT unset(const Str& name, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT get(const Str& name, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT properties(Out& result, Msg& message) = 0;
};

}  // namespace TcltaskI
