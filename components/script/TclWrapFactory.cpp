#include "Script/TclWrapFactory.h"

#include <cstdint>
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

// Factories are kept for the life of the process, so the table is never destroyed either: a library
// that winds down after this one may still ask it.
FactoryTable& Factories() {
    static FactoryTable* table = new FactoryTable;
    return *table;
}

}  // namespace

bool TclWrapFactory::RegisterFactory(const Port::XUID& interfaceId, CitI::ITclWrapFactory* factory) {
    if (factory == nullptr) return false;
    Factories()[{interfaceId.First(), interfaceId.Second()}] = factory;
    return true;
}

CitI::IInterface* TclWrapFactory::CreateInstance(const Port::XUID& id, CitI::IInterface* object, Tcl_Interp* interp) {
    const FactoryTable& table = Factories();
    auto it = table.find({id.First(), id.Second()});
    if (it == table.end()) return nullptr;
    return it->second->CreateInstance(id, object, interp);
}

}  // namespace Script
