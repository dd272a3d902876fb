#include "kit_core.h"

#include <atomic>
#include <cstring>
#include <mutex>
#include <stdexcept>
#include <unordered_map>

#include "kit_kinds.h"

namespace TestKit {

namespace {

// Lives for the process: kit objects that Tcl still holds at exit may die after static destruction,
// and must find it then. Interpreters on several threads make kit objects at once, hence the lock.
struct Registry {
    std::mutex lock;
    std::unordered_map<const void*, KitCore*> objects;
};

Registry& TheRegistry() {
    static auto* const registry = new Registry();
    return *registry;
}

std::atomic<long> g_live{0};

std::string TextOf(Tcl_Obj* obj) {
    int length = 0;
    const char* text = Tcl_GetStringFromObj(obj, &length);
    return std::string(text, static_cast<std::size_t>(length));
}

Made ReadMade(Tcl_Obj* word) {
    const std::string text = TextOf(word);
    if (text == "null") return Made::Null;
    if (text == "new") return Made::New;
    if (text == "same") return Made::Same;
    throw std::runtime_error("handler answered object \"" + text + "\": must be null, new or same");
}

CitI::IInterface* MakeOfKind(ObjectKind kind, Tcl_Interp* interp, Tcl_Obj* handler) {
    switch (kind) {
        case ObjectKind::TclProject:
            return MakeTclProject(KitSetup{interp, handler, nullptr});
        case ObjectKind::HDProject:
            return MakeHDProject(interp);
        case ObjectKind::Component:
            break;
    }
    return MakeComponent("component", interp);
}

}  // namespace

KitCore::KitCore(const void* face, std::string name, const KitSetup& setup)
    : m_face(face), m_name(std::move(name)), m_interp(setup.interp) {
    int words = 0;
    if (setup.handler && Tcl_ListObjLength(nullptr, setup.handler, &words) == TCL_OK && words > 0)
        m_handler = TclRef(setup.handler);
    if (m_face) {
        Registry& registry = TheRegistry();
        const std::lock_guard hold(registry.lock);
        registry.objects[m_face] = this;
    }
    ++g_live;
}

KitCore::~KitCore() {
    if (m_face) {
        Registry& registry = TheRegistry();
        const std::lock_guard hold(registry.lock);
        registry.objects.erase(m_face);
    }
    --g_live;
}

Tcl_Obj* KitCore::Calls() const {
    Tcl_Obj* list = Tcl_NewListObj(0, nullptr);
    for (const TclRef& call : m_calls) Tcl_ListObjAppendElement(nullptr, list, call.get());
    return list;
}

void KitCore::ForgetCalls() noexcept { m_calls.clear(); }

KitCore* KitCore::Find(const void* face) noexcept {
    if (!face) return nullptr;
    Registry& registry = TheRegistry();
    const std::lock_guard hold(registry.lock);
    const auto found = registry.objects.find(face);
    return found == registry.objects.end() ? nullptr : found->second;
}

long KitCore::Live() noexcept { return g_live; }

std::optional<Outcome> KitCore::Take(Tcl_Obj* call) {
    m_calls.emplace_back(call);
    if (!m_handler) return std::nullopt;
    return RunHandler(call);
}

Outcome KitCore::RunHandler(Tcl_Obj* call) {
    // A private copy of the prefix: nothing else can change the list while its words are evaluated.
    TclRef command(Tcl_DuplicateObj(m_handler.get()));
    Tcl_ListObjAppendList(nullptr, command.get(), call);
    int count = 0;
    Tcl_Obj** words = nullptr;
    Tcl_ListObjGetElements(nullptr, command.get(), &count, &words);

    // The frame that called the operation may have its own result standing; the handler's result
    // and error state must not replace it.
    SavedInterpState saved(m_interp);
    const int code = Tcl_EvalObjv(m_interp, count, words, TCL_EVAL_GLOBAL);
    TclRef answer(Tcl_GetObjResult(m_interp));
    if (code != TCL_OK)
        throw std::runtime_error("handler of " + m_name + " failed: " + TextOf(answer.get()));
    return ReadOutcome(answer.get());
}

CitI::MIInterface KitCore::Provide(ObjectKind kind, Made made) {
    // Only a project made for GetCurrentTclProject answers through the same handler.
    Tcl_Obj* handler = kind == ObjectKind::TclProject ? m_handler.get() : nullptr;
    switch (made) {
        case Made::Null:
            return nullptr;
        case Made::New:
            return CitI::MIInterface(MakeOfKind(kind, m_interp, handler));
        case Made::Same:
            break;
    }
    CitI::MIInterface& same = m_same[static_cast<std::size_t>(kind)];
    if (!same) same = CitI::MIInterface(MakeOfKind(kind, m_interp, handler));
    return same;
}

Outcome ReadOutcome(Tcl_Obj* answer) {
    int size = 0;
    if (Tcl_DictObjSize(nullptr, answer, &size) != TCL_OK)
        throw std::runtime_error("handler answered \"" + TextOf(answer) + "\", which is no dict");

    Outcome outcome;
    int known = 0;
    auto read = [&](const char* key, auto&& take) {
        Tcl_Obj* value = nullptr;
        TclRef keyObj(Tcl_NewStringObj(key, -1));
        Tcl_DictObjGet(nullptr, answer, keyObj.get(), &value);
        if (!value) return;
        ++known;
        take(value);
    };
    read("code", [&](Tcl_Obj* v) {
        Tcl_WideInt code = 0;
        if (Tcl_GetWideIntFromObj(nullptr, v, &code) != TCL_OK)
            throw std::runtime_error("handler answered code \"" + TextOf(v) + "\", which is no integer");
        outcome.code = code;
    });
    read("value", [&](Tcl_Obj* v) { outcome.value = TextOf(v); });
    read("message", [&](Tcl_Obj* v) { outcome.message = TextOf(v); });
    read("string", [&](Tcl_Obj* v) { outcome.string = TextOf(v); });
    read("object", [&](Tcl_Obj* v) { outcome.object = ReadMade(v); });
    read("helper", [&](Tcl_Obj* v) { outcome.helper = TextOf(v); });
    // A misspelt key would otherwise pass silently as the default.
    if (known != size)
        throw std::runtime_error("handler answered \"" + TextOf(answer) +
                                 "\": keys must be code, value, message, string, object or helper");
    return outcome;
}

}  // namespace TestKit
