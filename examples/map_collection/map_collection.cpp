// Named collections kept in a std::map: TcltaskI::ICollection on the implementer's kit. After `load`,
// `mapcollection` gives a new, empty object. docs/implementing.md walks through this file.
#include <algorithm>
#include <map>

#include "TcltaskI/ICollection.h"
#include "TcltaskKit/Kit.h"

namespace {

using namespace TcltaskKit;
using Words = std::vector<std::string>;
ModuleInit s_portLayer;  // holds the portability layer up while this module is loaded

constexpr Usage kUsages[] = {
    {"append_to", "append_to NAME ITEM... ?-unique?: appends items to the collection NAME; returns its items"},
    {"equal", "equal LIST LIST ?-order_dependent?: returns 1 when both hold the same items, else 0"},
    {"copy", "copy LIST: returns the items of LIST"},
    {"foreach", "foreach VAR LIST BODY: runs BODY with VAR set to each item in turn; returns nothing"},
    {"index", "index LIST POSITION: returns the item at POSITION, counted from 0"},
    {"remove_from", "remove_from NAME ITEM...: removes items from the collection NAME; returns its items"},
    {"sizeof", "sizeof LIST: returns the number of items"},
    {"set", "set NAME LIST: makes NAME a collection of the items of LIST; returns them"},
    {"get", "get NAME: returns the items of the collection NAME"},
    {"properties", "properties: returns a dict of every collection's name and size"},
};
constexpr HelpTable kHelp{"named collections kept in a std::map", kUsages};

class MapCollection final : public Component<TcltaskI::ICollection> {
public:
    explicit MapCollection(Tcl_Interp* in) : Component(NewCommandHelp(kHelp)), m_interp(in) { Tcl_Preserve(in); }
    ~MapCollection() override { Tcl_Release(m_interp); }  // foreach runs there: kept while this object lives

    RESULT append_to(const Str& name, const List& items, bool unique, Out& result, Msg& message) override {
        Words& members = m_map[name.c_str()];
        for (const Prop& item : items)
            if (!unique || std::ranges::count(members, TextOf(item)) == 0) members.push_back(TextOf(item));
        return Answer(NewList(members), result, message);
    }
    RESULT equal(const Prop& a, const Prop& b, bool order_dependent, Out& result, Msg& message) override {
        Words left, right;
        if (!WordsOf(a, left, message) || !WordsOf(b, right, message)) return 0;
        return Answer(NewBool(order_dependent ? left == right : std::ranges::is_permutation(left, right)), result, message);
    }
    RESULT copy(const Prop& list, Out& result, Msg& message) override {
        Words words;
        return WordsOf(list, words, message) ? Answer(NewList(words), result, message) : 0;
    }
    RESULT foreach(const Str& var, const Prop& list, const Str& body, Out&, Msg& message) override {
        // Tcl's own foreach runs the body: break, continue and errors work as in a script. No answer.
        const TclValue loop(NewList({NewText("::foreach"), NewText(var.c_str()), NewText(TextOf(list)), NewText(body.c_str())}));
        const int code = Tcl_EvalObjEx(m_interp, loop.get(), 0);
        return code == TCL_OK || Fail(message, code == TCL_ERROR ? Tcl_GetStringResult(m_interp) : "the body may not return");
    }
    RESULT index(const Prop& list, int32_t at, Out& result, Msg& message) override {
        Words words;
        if (!WordsOf(list, words, message)) return 0;
        if (at < 0 || at >= std::ssize(words)) return Fail(message, "index out of range");
        return Answer(NewText(words[static_cast<std::size_t>(at)]), result, message);
    }
    RESULT remove_from(const Str& name, const List& items, Out& result, Msg& message) override {
        const auto it = m_map.find(name.c_str());
        if (it == m_map.end()) return Fail(message, std::string("no collection is named ") + name.c_str());
        for (const Prop& item : items) std::erase(it->second, TextOf(item));
        return Answer(NewList(it->second), result, message);
    }
    RESULT sizeof_(const Prop& list, Out& result, Msg& message) override {
        Words words;
        return WordsOf(list, words, message) ? Answer(NewInt(std::ssize(words)), result, message) : 0;
    }
    RESULT set(const Str& name, const Prop& list, Out& result, Msg& message) override {
        Words words;
        if (!WordsOf(list, words, message)) return 0;
        return Answer(NewList(m_map[name.c_str()] = words), result, message);
    }
    RESULT get(const Str& name, Out& result, Msg& message) override { return remove_from(name, {}, result, message); }
    RESULT properties(Out& result, Msg& message) override {
        DictBuilder dict;
        for (const auto& [name, members] : m_map) dict.Add(name, members.size());
        return Answer(dict.Take(), result, message);
    }

private:
    Tcl_Interp* m_interp;
    std::map<std::string, Words> m_map;
};

int NewCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc != 1) Tcl_WrongNumArgs(interp, 1, objv, nullptr);
    return objc == 1 && HandToTcl(interp, TcltaskI::ICollectionID, new MapCollection(interp)) ? TCL_OK : TCL_ERROR;
}

}  // namespace

extern "C" __attribute__((visibility("default"))) int Mapcollection_Init(Tcl_Interp* interp) {
    if (!Tcl_InitStubs(interp, "8.6", 0) || !Tcl_PkgRequire(interp, "TcltaskI_Morvane", "1.0", 0)) return TCL_ERROR;
    Tcl_CreateObjCommand(interp, "mapcollection", NewCommand, nullptr, nullptr);
    return Tcl_PkgProvide(interp, "Mapcollection", "1.0");
}
