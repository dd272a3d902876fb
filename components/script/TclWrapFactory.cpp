#include "Script/TclWrapFactory.h"

#include <cstdint>
#include <mutex>
#include <shared_mutex>
#include <unordered_map>
#include <utility>

namespace Script {
namespace {

using FactoryKey = std::pair<uint64_t, uint64_t>;

struct FactoryKeyHash {
    size_t operator()(const FactoryKey& key) const noexcept {
        return static_cast<size_t>(key.first ^ (key.second * 0x9e3779b97f4a7c15ull));
    }
};

using FactoryTable = std::unordered_map<FactoryKey, CitI::ITclWrapFactory*, FactoryKeyHash>;

// Every thread that loads the package registers its factories, and any thread may make wrappers, so
// the table is read under a shared lock and written under an exclusive one.
struct Registry {
    std::shared_mutex lock;
    FactoryTable table;
};

// Factories are kept for the life of the process, so the table is never destroyed either: a library
// that winds down after this one may still ask it.
Registry& Factories() {
    static Registry* const registry = new Registry;
    return *registry;
}

}  // namespace

bool TclWrapFactory::RegisterFactory(const Port::XUID& interfaceId, CitI::ITclWrapFactory* factory) {
    if (factory == nullptr) return false;
    Registry& registry = Factories();
    const std::unique_lock hold(registry.lock);
    registry.table[{interfaceId.First(), interfaceId.Second()}] = factory;
    return true;
}

CitI::IInterface* TclWrapFactory::CreateInstance(const Port::XUID& id, CitI::IInterface* object, Tcl_Interp* interp) {
    Registry& registry = Factories();
    CitI::ITclWrapFactory* factory = nullptr;
    {
        const std::shared_lock hold(registry.lock);
        auto it = registry.table.find({id.First(), id.Second()});
        if (it == registry.table.end()) return nullptr;
        factory = it->second;
    }
    return factory->CreateInstance(id, object, interp);
}

}  // namespace Script
