// Named collections of design objects. Wherever a collection is expected, a word may be the name
// of a collection or a list of object names (which may include collection names).
#include <algorithm>
#include <set>

#include "TcltaskI/ICollection.h"
#include "component.h"
#include "design.h"
#include "property.h"

namespace kelmartool {

namespace {

// Keeps an interpreter allocated for as long as it lives, even when the interpreter is deleted.
class Preserved {
public:
    explicit Preserved(Tcl_Interp* interp) : m_interp(interp) { Tcl_Preserve(m_interp); }
    Preserved(const Preserved&) = delete;
    Preserved& operator=(const Preserved&) = delete;
    ~Preserved() { Tcl_Release(m_interp); }

private:
    Tcl_Interp* m_interp;
};

class Collection final : public Component<TcltaskI::ICollection> {
public:
    explicit Collection(const StatePtr& state) : m_state(state) {}

    CommonI::RESULT append_to(const Str& name, const List& items, bool unique, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::vector<std::string> add;
        if (!CheckName(name, message) || !ResolveAll(items, add, message)) return 0;
        std::vector<std::string> members = Members(name);  // changed on a copy: failures leave it whole
        for (std::string& object : add)
            if (!unique || std::find(members.begin(), members.end(), object) == members.end())
                members.push_back(std::move(object));
        m_state->collections[name.c_str()] = members;
        return Answer(NewList(members), result, message);
    }

    CommonI::RESULT equal(const Prop& a, const Prop& b, bool order_dependent, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::vector<std::string> ownLeft, ownRight;
        const std::vector<std::string>* left = View(a, ownLeft, message);
        const std::vector<std::string>* right = left ? View(b, ownRight, message) : nullptr;
        if (right == nullptr) return 0;
        if (order_dependent) return Answer(NewBool(*left == *right), result, message);
        std::vector<std::string> sortedLeft(*left), sortedRight(*right);
        std::sort(sortedLeft.begin(), sortedLeft.end());
        std::sort(sortedRight.begin(), sortedRight.end());
        return Answer(NewBool(sortedLeft == sortedRight), result, message);
    }

    CommonI::RESULT copy(const Prop& collection, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::vector<std::string> members;
        if (!Resolve(collection, members, message)) return 0;
        return Answer(NewList(members), result, message);
    }

    CommonI::RESULT foreach(const Str& variable, const Prop& collection, const Str& body, Out& result,
                            Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::vector<std::string> members;
        if (!Resolve(collection, members, message)) return 0;
        Tcl_Interp* interp = m_state->interp;
        // The body may have its interpreter deleted (through an alias of another one): Tcl then keeps
        // it allocated until the walk lets go of it, and the walk stops.
        const Preserved hold(interp);
        // One body object for the whole walk, so that Tcl compiles it once.
        TclValue script(NewText(body.c_str()));
        for (const std::string& member : members) {
            if (Tcl_InterpDeleted(interp)) return Fail(message, kStateGone);
            if (Tcl_SetVar2Ex(interp, variable.c_str(), nullptr, NewText(member), TCL_LEAVE_ERR_MSG) == nullptr)
                return Refuse(*m_state, message, Refusal::Value, Tcl_GetStringResult(interp));
            const int code = Tcl_EvalObjEx(interp, script.get(), 0);
            if (code == TCL_BREAK) break;
            if (code == TCL_OK || code == TCL_CONTINUE) continue;
            // The error code of the body's error stays, as Tcl's foreach keeps it.
            if (code == TCL_ERROR) {
                Tcl_AddErrorInfo(interp, "\n    (\"collection foreach\" body)");
                return Fail(message, Tcl_GetStringResult(interp));
            }
            // The answer of an operation is a value or a failure: a return, or a code of the script's
            // own, cannot pass through it, and is not to be lost.
            return Refuse(*m_state, message, Refusal::Script, {std::to_string(code)},
                          (code == TCL_RETURN ? std::string("\"return\"") : "the code " + std::to_string(code)) +
                              " cannot leave the body of collection foreach: the walk stopped at '" + member + "'");
        }
        Tcl_ResetResult(interp);
        result = nullptr;
        return 1;
    }

    CommonI::RESULT index(const Prop& collection, int32_t position, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::vector<std::string> members;
        if (!Resolve(collection, members, message)) return 0;
        if (position < 0 || static_cast<std::size_t>(position) >= members.size())
            return Refuse(*m_state, message, Refusal::Value,
                          "index " + std::to_string(position) + " is out of range: the collection holds " +
                              std::to_string(members.size()) + " objects");
        return Answer(NewText(members[static_cast<std::size_t>(position)]), result, message);
    }

    CommonI::RESULT remove_from(const Str& name, const List& items, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        auto it = m_state->collections.find(name.c_str());
        if (it == m_state->collections.end()) return UnknownCollection(name, message);
        std::vector<std::string> drop;
        if (!ResolveAll(items, drop, message)) return 0;
        const std::set<std::string> gone(drop.begin(), drop.end());
        std::erase_if(it->second, [&gone](const std::string& m) { return gone.count(m) != 0; });
        return Answer(NewList(it->second), result, message);
    }

    CommonI::RESULT sizeof_(const Prop& collection, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::vector<std::string> members;
        if (!Resolve(collection, members, message)) return 0;
        return Answer(NewInt(static_cast<long long>(members.size())), result, message);
    }

    CommonI::RESULT set(const Str& name, const Prop& value, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::vector<std::string> members;
        if (!CheckName(name, message) || !Resolve(value, members, message)) return 0;
        m_state->collections[name.c_str()] = members;
        return Answer(NewList(members), result, message);
    }

    CommonI::RESULT get(const Str& name, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        auto it = m_state->collections.find(name.c_str());
        if (it == m_state->collections.end()) return UnknownCollection(name, message);
        return Answer(NewList(it->second), result, message);
    }

    CommonI::RESULT properties(Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        DictBuilder dict;
        for (const auto& [name, members] : m_state->collections) dict.Add(name, members.size());
        return Answer(dict.Take(), result, message);
    }

private:
    CommonI::RESULT UnknownCollection(const Str& name, Msg& message) const {
        return Refuse(*m_state, message, Refusal::Unknown, {"COLLECTION", name.c_str()},
                      std::string("no collection is named '") + name.c_str() + "'");
    }

    std::vector<std::string> Members(const Str& name) const {
        auto it = m_state->collections.find(name.c_str());
        return it == m_state->collections.end() ? std::vector<std::string>{} : it->second;
    }

    // A collection may not take the name of a design object, which would hide the object.
    bool CheckName(const Str& name, Msg& message) const {
        const Design* design = m_state->CurrentDesign();
        if (design == nullptr) return Refuse(*m_state, message, Refusal::NoProject, kNoProject);
        if (name.IsEmpty()) return Refuse(*m_state, message, Refusal::Value, "a collection needs a name");
        if (design->Find(name.c_str()))
            return Refuse(*m_state, message, Refusal::Value,
                          std::string("'") + name.c_str() + "' names a design object and cannot name a collection");
        return true;
    }

    // The names that a property stands for (see ResolveView); null after the failure is set.
    const std::vector<std::string>* View(const Prop& value, std::vector<std::string>& own, Msg& message) const {
        std::string error;
        TclValue v = ValueOf(value);
        if (!v) v = TclValue(NewText(""));
        const std::vector<std::string>* names = ResolveView(*m_state, v.get(), own, error);
        if (names == nullptr) Fail(message, error);
        return names;
    }

    bool Resolve(const Prop& value, std::vector<std::string>& names, Msg& message) const {
        const std::vector<std::string>* found = View(value, names, message);
        if (found == nullptr) return false;
        if (found != &names) names = *found;
        return true;
    }

    bool ResolveAll(const List& items, std::vector<std::string>& names, Msg& message) const {
        for (const auto& item : items) {
            std::vector<std::string> some;
            if (!Resolve(item, some, message)) return false;
            names.insert(names.end(), some.begin(), some.end());
        }
        return true;
    }

    StatePtr m_state;
};

}  // namespace

CitI::IInterface* NewCollection(const StatePtr& state) {
    return static_cast<TcltaskI::ICollection*>(new Collection(state));
}

}  // namespace kelmartool
