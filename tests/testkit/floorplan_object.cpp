// Kit floorplans.
#include "TcltaskI/IXFloorplan.h"
#include "kit_kinds.h"
#include "kit_object.h"

namespace TestKit {

namespace {

using CommonI::RESULT;

class KitXFloorplan final : public KitObject<TcltaskI::IXFloorplan> {
public:
    using KitObject::KitObject;
    using S = const Str&;

    RESULT open(Out& r, Msg& m) override { KIT_OP(open, r, m); }
    RESULT open_full(S a, S b, S c, Out& r, Msg& m) override { KIT_OP(open_full, a, b, c, r, m); }
    RESULT open_empty(S a, S b, S c, S d, S e, S f, S g, S h, S i, Out& r, Msg& m) override {
        KIT_OP(open_empty, a, b, c, d, e, f, g, h, i, r, m);
    }
    RESULT close(bool n, Out& r, Msg& m) override { KIT_OP(close, n, r, m); }
    RESULT save(Out& r, Msg& m) override { KIT_OP(save, r, m); }
    RESULT import(S ucf, S csv, S vhdl, S vlog, Out& r, Msg& m) override { KIT_OP(import, ucf, csv, vhdl, vlog, r, m); }
    RESULT export_(S ucf, S csv, S vhdl, S vlog, Out& r, Msg& m) override { KIT_OP(export_, ucf, csv, vhdl, vlog, r, m); }
    RESULT group(S b, const Prop& c, Out& r, Msg& m) override { KIT_OP(group, b, c, r, m); }
    RESULT ungroup(const Prop& b, Out& r, Msg& m) override { KIT_OP(ungroup, b, r, m); }
    RESULT properties(Out& r, Msg& m) override { KIT_OP(properties, r, m); }
    RESULT get(S n, Out& r, Msg& m) override { KIT_OP(get, n, r, m); }
    RESULT set(S n, S v, Out& r, Msg& m) override { KIT_OP(set, n, v, r, m); }
    RESULT block_properties(Out& r, Msg& m) override { KIT_OP(block_properties, r, m); }
    RESULT block_get(const Prop& b, S n, Out& r, Msg& m) override { KIT_OP(block_get, b, n, r, m); }
    RESULT block_set_constraint(const Prop& b, S n, S v, Out& r, Msg& m) override {
        KIT_OP(block_set_constraint, b, n, v, r, m);
    }
    RESULT block_delete_constraint(const Prop& b, S n, Out& r, Msg& m) override {
        KIT_OP(block_delete_constraint, b, n, r, m);
    }
    RESULT prohibit(const Prop& s, Out& r, Msg& m) override { KIT_OP(prohibit, s, r, m); }
    RESULT allow(const Prop& s, Out& r, Msg& m) override { KIT_OP(allow, s, r, m); }
    RESULT drc(Out& r, Msg& m) override { KIT_OP(drc, r, m); }
    RESULT sso_analysis(Out& r, Msg& m) override { KIT_OP(sso_analysis, r, m); }
    RESULT clock_analysis(Out& r, Msg& m) override { KIT_OP(clock_analysis, r, m); }
    RESULT make_pin_compatible(S a, S b, S c, S d, Out& r, Msg& m) override {
        KIT_OP(make_pin_compatible, a, b, c, d, r, m);
    }
    RESULT zoom(S left, S right, Out& r, Msg& m) override { KIT_OP(zoom, left, right, r, m); }
    RESULT refresh(Out& r, Msg& m) override { KIT_OP(refresh, r, m); }
};

}  // namespace

CitI::IInterface* MakeXFloorplan(const KitSetup& setup) { return Make<KitXFloorplan>(setup); }

}  // namespace TestKit
