#include "watch.h"

#include <atomic>
#include <cstring>
#include <mutex>
#include <set>
#include <thread>
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

// Held only for a push, a swap or a look-up, never across a call out of the kit: a spin costs less
// than a mutex on the death of every component of every call.
class SpinLock {
public:
    void lock() noexcept {
        while (m_held.test_and_set(std::memory_order_acquire)) std::this_thread::yield();
    }
    void unlock() noexcept { m_held.clear(std::memory_order_release); }

private:
    std::atomic_flag m_held;
};

// Kept for the process: components may die during static teardown and still report. Components
// die on every interpreter thread, hence the lock.
struct State {
    SpinLock lock;
    std::vector<Event> events;
    std::set<std::string> faults;
    std::atomic<bool> anyFault{false};  // lets the factory's filters answer without the lock
};

State& TheState() {
    static auto* const state = new State();
    return *state;
}

void OnDeath(const Port::XUID& classId, const char* detail, void*) {
    for (const Watched& watched : kWatched) {
        if (!(classId == watched.classId)) continue;
        try {
            State& state = TheState();
            const std::lock_guard hold(state.lock);
            state.events.push_back(Event{&watched, watched.withDetail && detail ? detail : ""});
        } catch (...) {
            // Running out of memory here loses one event; the observer must not throw into Died.
        }
        return;
    }
}

// The factory is asked by name, or by a path for a library elsewhere: a path matches by its file name.
bool LoadAllowed(const char* name) {
    State& state = TheState();
    if (!state.anyFault.load(std::memory_order_acquire)) return true;
    const std::lock_guard hold(state.lock);
    const std::set<std::string>& faults = state.faults;
    std::string file = name;
    if (const auto slash = file.rfind('/'); slash != std::string::npos) file.erase(0, slash + 1);
    if (file.size() > 3 && file.compare(file.size() - 3, 3, ".so") == 0) file.resize(file.size() - 3);
    return faults.count(name) == 0 && faults.count(file) == 0;
}

bool CreateAllowed(const Port::XUID& classId) {
    State& state = TheState();
    if (!state.anyFault.load(std::memory_order_acquire)) return true;
    for (const Watched& watched : kWatched) {
        if (!(classId == watched.classId)) continue;
        const std::lock_guard hold(state.lock);
        return state.faults.count(watched.word) == 0;
    }
    return true;
}

}  // namespace

// The observer and the filters are functions of this library: when it is unloaded (Tcl unloads
// what it loaded as it finalizes) they must not be called any more.
namespace {
struct StopWatchingOnUnload {
    ~StopWatchingOnUnload() {
        CitP::InstanceTable::SetObserver(nullptr, nullptr);
        CitP::Factory::SetLoadFilter(nullptr);
        CitP::Factory::SetCreateFilter(nullptr);
    }
} s_stopWatchingOnUnload;
}  // namespace

void StartWatching() noexcept {
    CitP::InstanceTable::SetObserver(&OnDeath, nullptr);
    CitP::Factory::SetLoadFilter(&LoadAllowed);
    CitP::Factory::SetCreateFilter(&CreateAllowed);
}

Tcl_Obj* TakeEvents() {
    std::vector<Event> events;
    {
        State& state = TheState();
        const std::lock_guard hold(state.lock);
        events.swap(state.events);
    }
    Tcl_Obj* list = Tcl_NewListObj(0, nullptr);
    for (const Event& event : events) {
        Tcl_Obj* entry = Tcl_NewListObj(0, nullptr);
        Tcl_ListObjAppendElement(nullptr, entry, Tcl_NewStringObj("destroy", -1));
        Tcl_ListObjAppendElement(nullptr, entry, Tcl_NewStringObj(event.watched->word, -1));
        if (event.watched->withDetail)
            Tcl_ListObjAppendElement(nullptr, entry,
                                     Tcl_NewStringObj(event.detail.data(), static_cast<int>(event.detail.size())));
        Tcl_ListObjAppendElement(nullptr, list, entry);
    }
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
    State& state = TheState();
    const std::lock_guard hold(state.lock);
    if (on)
        state.faults.insert(what);
    else
        state.faults.erase(what);
    state.anyFault.store(!state.faults.empty(), std::memory_order_release);
    return true;
}

}  // namespace TestKit
