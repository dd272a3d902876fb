// Kit timing analyses.
#include "TcltaskI/ITimingAnalysis.h"
#include "kit_kinds.h"
#include "kit_object.h"

namespace TestKit {

namespace {

using CommonI::RESULT;

class KitTimingAnalysis final : public KitObject<TcltaskI::ITimingAnalysis> {
public:
    using KitObject::KitObject;

    RESULT properties(bool d, Out& r, Msg& m) override { KIT_OP(properties, d, r, m); }
    RESULT delete_(const Str& a, Out& r, Msg& m) override { KIT_OP(delete_, a, r, m); }
    RESULT disable_constraints(const Str& a, const List& c, Out& r, Msg& m) override {
        KIT_OP(disable_constraints, a, c, r, m);
    }
    RESULT disable_cpt(const Str& a, const Str& k, const List& l, Out& r, Msg& m) override {
        KIT_OP(disable_cpt, a, k, l, r, m);
    }
    RESULT enable_constraints(const Str& a, const List& c, Out& r, Msg& m) override {
        KIT_OP(enable_constraints, a, c, r, m);
    }
    RESULT get(const Str& a, const Str& n, Out& r, Msg& m) override { KIT_OP(get, a, n, r, m); }
    RESULT enable_cpt(const Str& a, const Str& k, const List& l, Out& r, Msg& m) override {
        KIT_OP(enable_cpt, a, k, l, r, m);
    }
    RESULT new_(const Str& a, const Str& n, Out& r, Msg& m) override { KIT_OP(new_, a, n, r, m); }
    RESULT reset(const Str& a, Out& r, Msg& m) override { KIT_OP(reset, a, r, m); }
    RESULT run(const Str& a, bool o, Out& r, Msg& m) override { KIT_OP(run, a, o, r, m); }
    RESULT save_as(const Str& a, const Str& f, Out& r, Msg& m) override { KIT_OP(save_as, a, f, r, m); }
    RESULT saveas(const Str& a, const Str& f, Out& r, Msg& m) override { KIT_OP(saveas, a, f, r, m); }
    RESULT set(const Str& a, const Str& n, const Prop& v, Out& r, Msg& m) override { KIT_OP(set, a, n, v, r, m); }
    RESULT set_constraint(const Str& a, const Str& n, const Prop& v, Out& r, Msg& m) override {
        KIT_OP(set_constraint, a, n, v, r, m);
    }
    RESULT set_endpoints(const Str& a, const Str& k, const Str& s, const List& e, Out& r, Msg& m) override {
        KIT_OP(set_endpoints, a, k, s, e, r, m);
    }
    RESULT set_query(const Str& a, const Str& k, const List& l, int32_t ld, int32_t hf, Out& r, Msg& m) override {
        KIT_OP(set_query, a, k, l, ld, hf, r, m);
    }
    RESULT set_filter(const Str& a, const Str& k, const Str& mode, const List& l, Out& r, Msg& m) override {
        KIT_OP(set_filter, a, k, mode, l, r, m);
    }
    RESULT show_settings(const Str& a, Out& r, Msg& m) override { KIT_OP(show_settings, a, r, m); }
};

}  // namespace

CitI::IInterface* MakeTimingAnalysis(const KitSetup& setup) { return Make<KitTimingAnalysis>(setup); }

}  // namespace TestKit
