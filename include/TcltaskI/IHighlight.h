// TcltaskI::IHighlight. Every operation gives 1 on success; the last two parameters are the out property
// (may stay null) and the failure text.
#pragma once

#include <cstdint>

#include "Port/StringBase.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskI {

inline constexpr Port::XUIDLiteral IHighlightID{0x400b745259584267ull, 0x975cd19a7cbf0c8full};

class IHighlight : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IHighlightID;
    static constexpr const char* NAME = "IHighlight";

    using Str = Port_String;
    using Prop = UtilI::MITclProperty;
    using List = UtilI::TclPropertyList;
    using Out = UtilI::MITclProperty;
    using Msg = Port_String;

    virtual CommonI::RESULT add(const List& items, const Str& color, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT remove(const List& items, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT new_(const List& items, const Str& color, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT current(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT clear(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT set(const Str& name, const Prop& value, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT get(const Str& name, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT properties(bool descriptors, Out& result, Msg& message) = 0;
};

}  // namespace TcltaskI
