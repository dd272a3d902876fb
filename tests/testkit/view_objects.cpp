// Kit graphical views, highlights, selections and searches.
#include "TcltaskI/IGraphicalView.h"
#include "TcltaskI/IHighlight.h"
#include "TcltaskI/ISearch.h"
#include "TcltaskI/ISelection.h"
#include "kit_kinds.h"
#include "kit_object.h"

namespace TestKit {

namespace {

using CommonI::RESULT;

class KitGraphicalView final : public KitObject<TcltaskI::IGraphicalView> {
public:
    using KitObject::KitObject;

    RESULT zoom(bool full, bool sel, bool in, bool out, bool det, bool last, const Prop& name, const Prop& center,
                const Prop& range, const Prop& xr, const Prop& yr, Out& r, Msg& m) override {
        KIT_OP(zoom, full, sel, in, out, det, last, name, center, range, xr, yr, r, m);
    }
    RESULT pan(bool left, bool right, bool up, bool down, bool top, bool bottom, bool fl, bool fr, const Prop& pc,
               const Prop& delta, const Prop& name, Out& r, Msg& m) override {
        KIT_OP(pan, left, right, up, down, top, bottom, fl, fr, pc, delta, name, r, m);
    }
    RESULT next(Out& r, Msg& m) override { KIT_OP(next, r, m); }
    RESULT previous(Out& r, Msg& m) override { KIT_OP(previous, r, m); }
};

class KitHighlight final : public KitObject<TcltaskI::IHighlight> {
public:
    using KitObject::KitObject;

    RESULT add(const List& l, const Str& c, Out& r, Msg& m) override { KIT_OP(add, l, c, r, m); }
    RESULT remove(const List& l, Out& r, Msg& m) override { KIT_OP(remove, l, r, m); }
    RESULT new_(const List& l, const Str& c, Out& r, Msg& m) override { KIT_OP(new_, l, c, r, m); }
    RESULT current(Out& r, Msg& m) override { KIT_OP(current, r, m); }
    RESULT clear(Out& r, Msg& m) override { KIT_OP(clear, r, m); }
    RESULT set(const Str& n, const Prop& v, Out& r, Msg& m) override { KIT_OP(set, n, v, r, m); }
    RESULT get(const Str& n, Out& r, Msg& m) override { KIT_OP(get, n, r, m); }
    RESULT properties(bool d, Out& r, Msg& m) override { KIT_OP(properties, d, r, m); }
};

class KitSelection final : public KitObject<TcltaskI::ISelection> {
public:
    using KitObject::KitObject;

    RESULT add(const List& l, Out& r, Msg& m) override { KIT_OP(add, l, r, m); }
    RESULT remove(const List& l, Out& r, Msg& m) override { KIT_OP(remove, l, r, m); }
    RESULT new_(const List& l, Out& r, Msg& m) override { KIT_OP(new_, l, r, m); }
    RESULT current(Out& r, Msg& m) override { KIT_OP(current, r, m); }
    RESULT clear(Out& r, Msg& m) override { KIT_OP(clear, r, m); }
    RESULT set(const Str& n, const Prop& v, Out& r, Msg& m) override { KIT_OP(set, n, v, r, m); }
    RESULT get(const Str& n, Out& r, Msg& m) override { KIT_OP(get, n, r, m); }
    RESULT properties(bool d, Out& r, Msg& m) override { KIT_OP(properties, d, r, m); }
};

class KitSearch final : public KitObject<TcltaskI::ISearch> {
public:
    using KitObject::KitObject;

    RESULT search(const Str& t, bool mc, bool em, bool re, bool ex, const List& type, const List& in, Out& r,
                  Msg& m) override {
        KIT_OP(search, t, mc, em, re, ex, type, in, r, m);
    }
};

}  // namespace

CitI::IInterface* MakeGraphicalView(const KitSetup& setup) { return Make<KitGraphicalView>(setup); }
CitI::IInterface* MakeHighlight(const KitSetup& setup) { return Make<KitHighlight>(setup); }
CitI::IInterface* MakeSelection(const KitSetup& setup) { return Make<KitSelection>(setup); }
CitI::IInterface* MakeSearch(const KitSetup& setup) { return Make<KitSearch>(setup); }

}  // namespace TestKit
