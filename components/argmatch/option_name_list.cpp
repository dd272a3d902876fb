#include "option_name_list.h"

#include <new>
#include <utility>

#include "CitP/InstanceTable.h"

namespace ArgMatchKit {

namespace {
// Most commands declare a handful of options; one allocation covers them.
constexpr std::size_t kTypicalNames = 8;
// The stores a thread keeps for its next lists; what ends beyond that goes back to the heap.
constexpr std::size_t kPooledStores = 16;

struct StorePool {
    static void Discard(void* store) noexcept { delete static_cast<NameStore*>(store); }
};
using Pool = Port::ThreadShelf<StorePool, kPooledStores>;

}  // namespace

StoreRef::StoreRef(const StoreRef& other) noexcept : m_store(other.m_store) {
    if (m_store) ++m_store->m_refs;
}

StoreRef& StoreRef::operator=(const StoreRef& other) noexcept {
    StoreRef keep(other);
    std::swap(m_store, keep.m_store);
    return *this;
}

StoreRef& StoreRef::operator=(StoreRef&& other) noexcept {
    if (this != &other) {
        Reset();
        m_store = std::exchange(other.m_store, nullptr);
    }
    return *this;
}

StoreRef::~StoreRef() { Reset(); }

bool StoreRef::Shared() const noexcept { return m_store && m_store->m_refs > 1; }

void StoreRef::Reset() noexcept {
    NameStore* store = std::exchange(m_store, nullptr);
    if (!store || --store->m_refs > 0) return;
    store->names.clear();
    if (!Port::kRecycleBlocks || !Pool::Put(store)) delete store;
}

StoreRef StoreRef::Fresh() noexcept {
    auto* store = static_cast<NameStore*>(Pool::Take());
    if (!store) {
        store = new (std::nothrow) NameStore;
        if (!store) return StoreRef();
        try {
            store->names.reserve(kTypicalNames);
        } catch (const std::bad_alloc&) {
            delete store;
            return StoreRef();
        }
    }
    store->m_refs = 1;
    return StoreRef(store);
}

OptionNameList::OptionNameList() noexcept { CitP::InstanceTable::Born(OptionNameListID); }

OptionNameList::~OptionNameList() { CitP::InstanceTable::Died(OptionNameListID, nullptr); }

CitI::IInterface* OptionNameList::GetInterface(const Port::XUID& id) {
    if (id == IOptionNameListID || id == CitI::IInterfaceID) return this;
    if (id == CommonI::IRefCountID) return &m_counter;
    return nullptr;
}

CommonI::RESULT OptionNameList::Add(const Port_String& name) {
    try {
        if (!m_names || m_names.Shared()) {
            StoreRef fresh = StoreRef::Fresh();
            if (!fresh) return 0;
            if (m_names) fresh->names = m_names->names;
            m_names = fresh;
        }
        m_names->names.push_back(name);
        return 1;
    } catch (const std::bad_alloc&) {
        return 0;
    }
}

CommonI::RESULT OptionNameList::Clear() {
    if (m_names.Shared())
        m_names.Reset();  // the iterators keep the old names; this list starts afresh
    else if (m_names)
        m_names->names.clear();  // keeps the room for the names of the next round
    return 1;
}

CommonI::RESULT OptionNameList::GetIterator(CommonI::RefCountPtr<IOptionNameIterator>& out) {
    auto* iterator = new (std::nothrow) OptionNameIterator(m_names);
    if (!iterator) return 0;
    out = CommonI::RefCountPtr<IOptionNameIterator>(iterator);
    return 1;
}

int32_t OptionNameList::Size() { return m_names ? static_cast<int32_t>(m_names->names.size()) : 0; }

OptionNameIterator::OptionNameIterator(StoreRef names) noexcept : m_names(std::move(names)) {}

CitI::IInterface* OptionNameIterator::GetInterface(const Port::XUID& id) {
    if (id == IOptionNameIteratorID || id == CitI::IInterfaceID)
        return static_cast<IOptionNameIterator*>(this);
    if (id == IOptionNameSourceID) return static_cast<IOptionNameSource*>(this);
    if (id == OwnIteratorID) return static_cast<IOptionNameIterator*>(this);
    if (id == CommonI::IRefCountID) return &m_counter;
    return nullptr;
}

const std::vector<Port_String>& OptionNameIterator::Names() const noexcept {
    static const std::vector<Port_String> none;
    return m_names ? m_names->names : none;
}

Port_String OptionNameIterator::Current() { return IsDone() ? Port_String() : m_names->names[m_pos]; }

void OptionNameIterator::First() { m_pos = 0; }

void OptionNameIterator::Next() {
    if (!IsDone()) ++m_pos;
}

bool OptionNameIterator::IsDone() { return !m_names || m_pos >= m_names->names.size(); }

}  // namespace ArgMatchKit
