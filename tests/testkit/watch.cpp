#include "watch.h"

#include <cstring>
#include <set>
#include <vector>

#include "ArgMatch/ICmdArgMatcher.h"
#include "CitP/Factory.h"
#include "CitP/InstanceTable.h"
#include "UtilI/ITclProperty.h"
#include "kit_core.h"

namespace TestKit {

namespace {

// A component class the kit reports on, under its word in `live`, `events` and `fault`.
struct Watched {
    const char* word;
    Port::XUIDLiteral classId;
    bool withDetail;  // a property's end tells its text
};

constexpr Watched kWatched[] = {
    {"property", UtilI::TclPropertyID, true},
    {"matcher", CmdArgMatcherID, false},
    {"namelist", OptionNameListID, false},
};

constexpr const char* kLibraries[] = {"libTcltask_Support", "libArgMatchKit"};

struct Event {
    const Watched* watched;
    std::string detail;
};

// Kept for the process: components may die during static teardown and still report.
struct State {
    std::vector<Event> events;
    std::set<std::string> faults;
};

State& TheState() {
    static auto* state = new State();
    return *state;
}

void OnDeath(const Port::XUID& classId, const char* detail, void*) {
    for (const Watched& watched : kWatched) {
        if (!(classId == watched.classId)) continue;
        try {
            TheState().events.push_back(Event{&watched, watched.withDetail && detail ? detail : ""});
        } catch (...) {
            // Running out of memory here loses one event; the observer must not throw into Died.
        }
        return;
    }
}

// The factory is asked by name, or by a path for a library elsewhere: a path matches by its file name.
bool LoadAllowed(const char* name) {
    const std::set<std::string>& faults = TheState().faults;
    if (faults.empty()) return true;
    std::string file = name;
    if (const auto slash = file.rfind('/'); slash != std::string::npos) file.erase(0, slash + 1);
    if (file.size() > 3 && file.compare(file.size() - 3, 3, ".so") == 0) file.resize(file.size() - 3);
    return faults.count(name) == 0 && faults.count(file) == 0;
}

bool CreateAllowed(const Port::XUID& classId) {
    for (const Watched& watched : kWatched)
        if (classId == watched.classId) return TheState().faults.count(watched.word) == 0;
    return true;
}

}  // namespace

void StartWatching() noexcept {
    CitP::InstanceTable::SetObserver(&OnDeath, nullptr);
    CitP::Factory::SetLoadFilter(&LoadAllowed);
    CitP::Factory::SetCreateFilter(&CreateAllowed);
}

Tcl_Obj* TakeEvents() {
    Tcl_Obj* list = Tcl_NewListObj(0, nullptr);
    for (const Event& event : TheState().events) {
        Tcl_Obj* entry = Tcl_NewListObj(0, nullptr);
        Tcl_ListObjAppendElement(nullptr, entry, Tcl_NewStringObj("destroy", -1));
        Tcl_ListObjAppendElement(nullptr, entry, Tcl_NewStringObj(event.watched->word, -1));
        if (event.watched->withDetail)
            Tcl_ListObjAppendElement(nullptr, entry,
                                     Tcl_NewStringObj(event.detail.data(), static_cast<int>(event.detail.size())));
        Tcl_ListObjAppendElement(nullptr, list, entry);
    }
    TheState().events.clear();
    return list;
}

Tcl_Obj* LiveCounts() {
    Tcl_Obj* dict = Tcl_NewDictObj();
    for (const Watched& watched : kWatched)
        Tcl_DictObjPut(nullptr, dict, Tcl_NewStringObj(watched.word, -1),
                       Tcl_NewLongObj(CitP::InstanceTable::Live(watched.classId)));
    Tcl_DictObjPut(nullptr, dict, Tcl_NewStringObj("object", -1), Tcl_NewLongObj(KitCore::Live()));
    return dict;
}

bool SetFault(const std::string& what, bool on, std::string& error) {
    bool known = false;
    for (const char* library : kLibraries) known = known || what == library;
    for (const Watched& watched : kWatched) known = known || what == watched.word;
    if (!known) {
        error = "unknown fault \"" + what +
                "\": must be libTcltask_Support, libArgMatchKit, property, matcher or namelist";
        return false;
    }
    if (on)
        TheState().faults.insert(what);
    else
        TheState().faults.erase(what);
    return true;
}

}  // namespace TestKit
