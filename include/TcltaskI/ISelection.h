// TcltaskI::ISelection. Every operation gives 1 on success; the last two parameters are the out property
// (may stay null) and the failure text.
#pragma once

#include <cstdint>

#include "Port/StringBase.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskI {

inline constexpr Port::XUIDLiteral ISelectionID{0x9e920be2b47b4540ull, 0x808e607f4be92d63ull};

class ISelection : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = ISelectionID;
    static constexpr const char* NAME = "ISelection";

    using Str = Port_String;
    using Prop = UtilI::MITclProperty;
    using List = UtilI::TclPropertyList;
    using Out = UtilI::MITclProperty;
    using Msg = Port_String;

    virtual CommonI::RESULT add(const List& items, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT remove(const List& items, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT new_(const List& items, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT current(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT clear(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT set(const Str& name, const Prop& value, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT get(const Str& name, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT properties(bool descriptors, Out& result, Msg& message) = 0;
};

}  // namespace TcltaskI
