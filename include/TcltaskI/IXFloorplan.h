// TcltaskI::IXFloorplan. Every operation gives 1 on success; the last two parameters are the out property
// (may stay null) and the failure text.
#pragma once

#include <cstdint>

#include "Port/StringBase.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskI {

inline constexpr Port::XUIDLiteral IXFloorplanID{0x0bdbaa0c7a484445ull, 0xac0790e9b86a6c67ull};

class IXFloorplan : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IXFloorplanID;
    static constexpr const char* NAME = "IXFloorplan";

    using Str = Port_String;
    using Prop = UtilI::MITclProperty;
    using List = UtilI::TclPropertyList;
    using Out = UtilI::MITclProperty;
    using Msg = Port_String;

    virtual CommonI::RESULT open(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT open_full(const Str& s1, const Str& s2, const Str& s3, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT open_empty(const Str& s1, const Str& s2, const Str& s3, const Str& s4, const Str& s5,
                                       const Str& s6, const Str& s7, const Str& s8, const Str& s9, Out& result,
                                       Msg& message) = 0;
    virtual CommonI::RESULT close(bool nosave, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT save(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT import(const Str& ucf, const Str& csv, const Str& vhdl, const Str& vlog, Out& result,
                                   Msg& message) = 0;
    virtual CommonI::RESULT export_(const Str& ucf, const Str& csv, const Str& vhdl, const Str& vlog, Out& result,
                                    Msg& message) = 0;
    virtual CommonI::RESULT group(const Str& block, const Prop& cells, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT ungroup(const Prop& block, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT properties(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT get(const Str& name, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT set(const Str& name, const Str& value, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT block_properties(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT block_get(const Prop& block, const Str& name, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT block_set_constraint(const Prop& block, const Str& name, const Str& value, Out& result,
                                                 Msg& message) = 0;
    virtual CommonI::RESULT block_delete_constraint(const Prop& block, const Str& name, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT prohibit(const Prop& sites, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT allow(const Prop& sites, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT drc(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT sso_analysis(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT clock_analysis(Out& result, Msg& message) = 0;
    virtual CommonI::RESULT make_pin_compatible(const Str& s1, const Str& s2, const Str& s3, const Str& s4,
                                                Out& result, Msg& message) = 0;
    virtual CommonI::RESULT zoom(const Str& left, const Str& right, Out& result, Msg& message) = 0;
    virtual CommonI::RESULT refresh(Out& result, Msg& message) = 0;
};

}  // namespace TcltaskI
