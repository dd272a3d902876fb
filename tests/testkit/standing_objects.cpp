// The kit objects that live for the process: project helpers by name and the holders behind wrappers
// without an object. Both are handed to Tcl more than once and must give the same word each time,
// and neither is counted, so nothing else would keep them.
#include <map>
#include <mutex>

#include "kit_kinds.h"

namespace TestKit {

namespace {

class KitHelper final : public Dpm::IProjectHelper, public KitCore {
public:
    explicit KitHelper(const std::string& name) : KitCore(static_cast<Dpm::IProjectHelper*>(this), name, KitSetup{}) {}

    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        return id == CitI::IInterfaceID ? static_cast<Dpm::IProjectHelper*>(this) : nullptr;
    }
    Port_String GetName() override { return Port_String(Name().data(), static_cast<int32_t>(Name().size())); }
};

// Answers CitI::IInterface but not the task interface it stands for.
class OrphanHolder final : public CitI::IInterface, public KitCore {
public:
    explicit OrphanHolder(const char* kind) : KitCore(nullptr, kind, KitSetup{}) {}

    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        return id == CitI::IInterfaceID ? this : nullptr;
    }
};

// Never destroyed: Tcl may still ask a helper for its name while the process goes down.
template <class T>
std::map<std::string, T*>& Standing() {
    static auto* const objects = new std::map<std::string, T*>();
    return *objects;
}

template <class T>
T* StandingNamed(const std::string& name) {
    static std::mutex lock;
    const std::lock_guard hold(lock);
    T*& object = Standing<T>()[name];
    if (!object) object = new T(name.c_str());
    return object;
}

}  // namespace

Dpm::IProjectHelper* HelperNamed(const std::string& name) { return StandingNamed<KitHelper>(name); }

CitI::IInterface* OrphanOf(const TaskKind& kind) { return StandingNamed<OrphanHolder>(kind.name); }

}  // namespace TestKit
