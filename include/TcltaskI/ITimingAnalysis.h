// TcltaskI::ITimingAnalysis. Every operation gives 1 on success; the last two parameters are the out property
// (may stay null) and the failure text.
#pragma once

#include <cstdint>

#include "Port/StringBase.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskI {

inline constexpr Port::XUIDLiteral ITimingAnalysisID{0xa6212362c22b4655ull, 0x8848e729ddd44aefull};

class ITimingAnalysis : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = ITimingAnalysisID;
    static constexpr const char* NAME = "ITimingAnalysis";

    using Str = Port_String;
    using Prop = UtilI::MITclProperty;
    using List = UtilI::TclPropertyList;
    using Out = UtilI::MITclProperty;
    using Msg = Port_String;

    virtual CommonI::RESULT properties(bool descriptors, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT delete_(const Str& analysis, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT disable_constraints(const Str& analysis, const List& constraints, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT disable_cpt(const Str& analysis, const Str& kind, const List& items, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT enable_constraints(const Str& analysis, const List& constraints, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT get(const Str& analysis, const Str& name, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT enable_cpt(const Str& analysis, const Str& kind, const List& items, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT new_(const Str& analysis, const Str& name, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT reset(const Str& analysis, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT run(const Str& analysis, bool overwrite, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT save_as(const Str& analysis, const Str& file, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT saveas(const Str& analysis, const Str& file, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT set(const Str& analysis, const Str& name, const Prop& value, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT set_constraint(const Str& analysis, const Str& name, const Prop& value, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT set_endpoints(const Str& analysis, const Str& kind, const Str& side, const List& endpoints,
                                          Out& result, Msg& message) = 0;
    virtual CommonI::RESULT set_query(const Str& analysis, const Str& kind, const List& items, int32_t ld, int32_t hf,
                                      Out& result, Msg& message) = 0;
    virtual CommonI::RESULT set_filter(const Str& analysis, const Str& kind, const Str& mode, const List& items,
                                       Out& result, Msg& message) = 0;
    virtual CommonI::RESULT show_settings(const Str& analysis, Out& result, Msg& message) = 0;
};

}  // namespace TcltaskI
