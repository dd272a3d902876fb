// TcltaskI::ISearch. Every operation gives 1 on success; the last two parameters are the out property
// (may stay null) and the failure text.
#pragma once

#include <cstdint>

#include "Port/StringBase.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskI {

inline constexpr Port::XUIDLiteral ISearchID{0xf41fcb3f1fd04d26ull, 0x8a600ada8c79aa55ull};

class ISearch : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = ISearchID;
    static constexpr const char* NAME = "ISearch";

    using Str = Port_String;
    using Prop = UtilI::MITclProperty;
    using List = UtilI::TclPropertyList;
    using Out = UtilI::MITclProperty;
    using Msg = Port_String;

    virtual CommonI::RESULT search(const Str& text, bool matchcase, bool exactmatch, bool regexp, bool exp,
                                   const List& type, const List& in, Out& result, Msg& message) = 0;
};

}  // namespace TcltaskI
