// The option name list component and the iterator it hands out.
#pragma once

#include <cstddef>
#include <memory>
#include <vector>

#include "ArgMatch/ICmdArgMatcher.h"

namespace ArgMatchKit {

using NameStore = std::vector<Port_String>;

// A list of option names in the order they were added. An iterator shares the list's store instead
// of copying it; a change to a shared store is made on a private copy, so that an iterator always
// walks the names as they stood when it was made (a matcher may be handed an iterator over the very
// list it fills). The components belong to the interpreter's thread; nothing here is locked.
class OptionNameList final : public IOptionNameList {
public:
    OptionNameList() noexcept;
    ~OptionNameList() override;
    OptionNameList(const OptionNameList&) = delete;
    OptionNameList& operator=(const OptionNameList&) = delete;

    CitI::IInterface* GetInterface(const Port::XUID& id) override;

    CommonI::RESULT Add(const Port_String& name) override;
    CommonI::RESULT Clear() override;
    CommonI::RESULT GetIterator(CommonI::RefCountPtr<IOptionNameIterator>& out) override;
    int32_t Size() override;

private:
    CommonI::RefCounter m_counter{this};
    std::shared_ptr<NameStore> m_names;  // null while the list has never held a name
};

// The identifier under which an iterator of this library answers with itself, so that the
// library's matcher reads its names in place instead of through copies. Not an interface of the
// system: another library's iterator does not know it and is read through IOptionNameIterator.
inline constexpr Port::XUIDLiteral OwnIteratorID{0x5b0e7d2c94a14f6eull, 0x8c3f61a0d27b9e45ull};

// Walks a shared store of names; it is also the candidate source that a matcher reads.
class OptionNameIterator final : public IOptionNameIterator, public IOptionNameSource {
public:
    // The names it walks, as they stood when it was made; empty when there are none.
    const NameStore& Names() const noexcept;

    explicit OptionNameIterator(std::shared_ptr<const NameStore> names) noexcept;
    OptionNameIterator(const OptionNameIterator&) = delete;
    OptionNameIterator& operator=(const OptionNameIterator&) = delete;

    CitI::IInterface* GetInterface(const Port::XUID& id) override;

    Port_String Current() override;
    void First() override;
    void Next() override;
    bool IsDone() override;

private:
    CommonI::RefCounter m_counter{static_cast<IOptionNameIterator*>(this)};
    std::shared_ptr<const NameStore> m_names;
    std::size_t m_pos = 0;
};

}  // namespace ArgMatchKit
