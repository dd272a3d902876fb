#include "option_name_list.h"

#include <new>
#include <utility>

#include "CitP/InstanceTable.h"

namespace ArgMatchKit {

namespace {
// Most commands declare a handful of options; one allocation covers them.
constexpr std::size_t kTypicalNames = 8;
}  // namespace

OptionNameList::OptionNameList() noexcept { CitP::InstanceTable::Born(OptionNameListID); }

OptionNameList::~OptionNameList() { CitP::InstanceTable::Died(OptionNameListID, nullptr); }

CitI::IInterface* OptionNameList::GetInterface(const Port::XUID& id) {
    if (id == IOptionNameListID || id == CitI::IInterfaceID) return this;
    if (id == CommonI::IRefCountID) return &m_counter;
    return nullptr;
}

CommonI::RESULT OptionNameList::Add(const Port_String& name) {
    try {
        if (!m_names) {
            auto fresh = std::make_shared<NameStore>();
            fresh->reserve(kTypicalNames);
            m_names = std::move(fresh);
        } else if (m_names.use_count() > 1) {
            m_names = std::make_shared<NameStore>(*m_names);
        }
        m_names->push_back(name);
        return 1;
    } catch (const std::bad_alloc&) {
        return 0;
    }
}

CommonI::RESULT OptionNameList::Clear() {
    if (m_names.use_count() > 1)
        m_names.reset();  // the iterators keep the old names; this list starts afresh
    else if (m_names)
        m_names->clear();  // keeps the room for the names of the next round
    return 1;
}

CommonI::RESULT OptionNameList::GetIterator(CommonI::RefCountPtr<IOptionNameIterator>& out) {
    auto* iterator = new (std::nothrow) OptionNameIterator(m_names);
    if (!iterator) return 0;
    out = CommonI::RefCountPtr<IOptionNameIterator>(iterator);
    return 1;
}

int32_t OptionNameList::Size() { return m_names ? static_cast<int32_t>(m_names->size()) : 0; }

OptionNameIterator::OptionNameIterator(std::shared_ptr<const NameStore> names) noexcept
    : m_names(std::move(names)) {}

CitI::IInterface* OptionNameIterator::GetInterface(const Port::XUID& id) {
    if (id == IOptionNameIteratorID || id == CitI::IInterfaceID)
        return static_cast<IOptionNameIterator*>(this);
    if (id == IOptionNameSourceID) return static_cast<IOptionNameSource*>(this);
    if (id == OwnIteratorID) return static_cast<IOptionNameIterator*>(this);
    if (id == CommonI::IRefCountID) return &m_counter;
    return nullptr;
}

const NameStore& OptionNameIterator::Names() const noexcept {
    static const NameStore none;
    return m_names ? *m_names : none;
}

Port_String OptionNameIterator::Current() { return IsDone() ? Port_String() : (*m_names)[m_pos]; }

void OptionNameIterator::First() { m_pos = 0; }

void OptionNameIterator::Next() {
    if (!IsDone()) ++m_pos;
}

bool OptionNameIterator::IsDone() { return !m_names || m_pos >= m_names->size(); }

}  // namespace ArgMatchKit
