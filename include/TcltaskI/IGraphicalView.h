// TcltaskI::IGraphicalView. Every operation gives 1 on success; the last two parameters are the out property
// (may stay null) and the failure text.
#pragma once

#include <cstdint>

#include "Port/StringBase.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskI {

inline constexpr Port::XUIDLiteral IGraphicalViewID{0x5eb07964a4d04609ull, 0x8999f9960ee3a2caull};

class IGraphicalView : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IGraphicalViewID;
    static constexpr const char* NAME = "IGraphicalView";

    using Str = Port_String;
    using Prop = UtilI::MITclProperty;
    using List = UtilI::TclPropertyList;
    using Out = UtilI::MITclProperty;
    using Msg = Port_String;

    virtual CommonI::RESULT zoom(bool full, bool selection, bool in, bool out, bool detailed, bool last,
                                 const Prop& name, const Prop& center, const Prop& range, const Prop& xrange,
                                 const Prop& yrange, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT pan(bool left, bool right, bool up, bool down, bool top, bool bottom, bool farleft,
                                bool farright, const Prop& percentage, const Prop& delta, const Prop& name,
                                Out& result, Msg& message) = 0;
    virtual CommonI::RESULT next(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT previous(Out& result, Msg& message) = 0;
};

}  // namespace TcltaskI
