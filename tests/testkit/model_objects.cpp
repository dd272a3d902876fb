// Kit collections, global settings and object queries.
#include "TcltaskI/ICollection.h"
#include "TcltaskI/IGlobal.h"
#include "TcltaskI/IObject.h"
#include "kit_kinds.h"
#include "kit_object.h"

namespace TestKit {

namespace {

using CommonI::RESULT;

class KitCollection final : public KitObject<TcltaskI::ICollection> {
public:
    using KitObject::KitObject;

    RESULT append_to(const Str& n, const List& l, bool u, Out& r, Msg& m) override { KIT_OP(append_to, n, l, u, r, m); }
    RESULT equal(const Prop& a, const Prop& b, bool o, Out& r, Msg& m) override { KIT_OP(equal, a, b, o, r, m); }
    RESULT copy(const Prop& c, Out& r, Msg& m) override { KIT_OP(copy, c, r, m); }
    RESULT foreach(const Str& v, const Prop& c, const Str& b, Out& r, Msg& m) override { KIT_OP(foreach, v, c, b, r, m); }
    RESULT index(const Prop& c, int32_t p, Out& r, Msg& m) override { KIT_OP(index, c, p, r, m); }
    RESULT remove_from(const Str& n, const List& l, Out& r, Msg& m) override { KIT_OP(remove_from, n, l, r, m); }
    RESULT sizeof_(const Prop& c, Out& r, Msg& m) override { KIT_OP(sizeof_, c, r, m); }
    RESULT set(const Str& n, const Prop& v, Out& r, Msg& m) override { KIT_OP(set, n, v, r, m); }
    RESULT get(const Str& n, Out& r, Msg& m) override { KIT_OP(get, n, r, m); }
    RESULT properties(Out& r, Msg& m) override { KIT_OP(properties, r, m); }
};

class KitGlobal final : public KitObject<TcltaskI::IGlobal> {
public:
    using KitObject::KitObject;

    RESULT set(const Str& n, const Prop& v, Out& r, Msg& m) override { KIT_OP(set, n, v, r, m); }
    RESULT unset(const Str& n, Out& r, Msg& m) override { KIT_OP(unset, n, r, m); }
    RESULT get(const Str& n, Out& r, Msg& m) override { KIT_OP(get, n, r, m); }
    RESULT properties(Out& r, Msg& m) override { KIT_OP(properties, r, m); }
};

class KitObjectQuery final : public KitObject<TcltaskI::IObject> {
public:
    using KitObject::KitObject;

    RESULT name(const Prop& o, Out& r, Msg& m) override { KIT_OP(name, o, r, m); }
    RESULT type(const Prop& o, Out& r, Msg& m) override { KIT_OP(type, o, r, m); }
    RESULT get(const Prop& o, const Str& p, Out& r, Msg& m) override { KIT_OP(get, o, p, r, m); }
    RESULT properties(const Prop& o, bool d, Out& r, Msg& m) override { KIT_OP(properties, o, d, r, m); }
};

}  // namespace

CitI::IInterface* MakeCollection(const KitSetup& setup) { return Make<KitCollection>(setup); }
CitI::IInterface* MakeGlobal(const KitSetup& setup) { return Make<KitGlobal>(setup); }
CitI::IInterface* MakeObject(const KitSetup& setup) { return Make<KitObjectQuery>(setup); }

}  // namespace TestKit
