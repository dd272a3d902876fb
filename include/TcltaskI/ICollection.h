// TcltaskI::ICollection. Every operation gives 1 on success; the last two parameters are the out property
// (may stay null) and the failure text.
#pragma once

#include <cstdint>

#include "Port/StringBase.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskI {

inline constexpr Port::XUIDLiteral ICollectionID{0x46d2ad5270684ab8ull, 0x81b45c9aa2b2cc67ull};

class ICollection : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = ICollectionID;
    static constexpr const char* NAME = "ICollection";

    using Str = Port_String;
    using Prop = UtilI::MITclProperty;
    using List = UtilI::TclPropertyList;
    using Out = UtilI::MITclProperty;
    using Msg = Port_String;

    virtual CommonI::RESULT append_to(const Str& name, const List& items, bool unique, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT equal(const Prop& a, const Prop& b, bool order_dependent, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT copy(const Prop& collection, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT foreach(const Str& variable, const Prop& collection, const Str& body, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT index(const Prop& collection, int32_t position, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT remove_from(const Str& name, const List& items, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT sizeof_(const Prop& collection, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT set(const Str& name, const Prop& value, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT get(const Str& name, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT properties(Out& result, Msg& message) = 0;
};

}  // namespace TcltaskI
