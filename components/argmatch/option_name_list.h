// The option name list component and the iterator it hands out.
#pragma once

#include <cstddef>
#include <vector>

#include "ArgMatch/ICmdArgMatcher.h"
#include "Port/Recycle.h"

namespace ArgMatchKit {

class NameStore;

// A counted reference to a store of names. The count is plain, not atomic: a list and its iterators
// stay on their interpreter's thread. The last reference hands the store back to its thread's pool,
// emptied but with its room kept, so that the next list of a call takes no memory from the heap.
class StoreRef {
public:
    StoreRef() noexcept = default;
    StoreRef(const StoreRef& other) noexcept;
    StoreRef(StoreRef&& other) noexcept : m_store(other.m_store) { other.m_store = nullptr; }
    StoreRef& operator=(const StoreRef& other) noexcept;
    StoreRef& operator=(StoreRef&& other) noexcept;
    ~StoreRef();

    // A store of its own from the pool, empty; null when no memory is left.
    static StoreRef Fresh() noexcept;

    explicit operator bool() const noexcept { return m_store != nullptr; }
    NameStore* operator->() const noexcept { return m_store; }
    NameStore& operator*() const noexcept { return *m_store; }
    bool Shared() const noexcept;
    void Reset() noexcept;

private:
    explicit StoreRef(NameStore* store) noexcept : m_store(store) {}
    NameStore* m_store = nullptr;
};

class NameStore {
public:
    std::vector<Port_String> names;

private:
    friend class StoreRef;
    long m_refs = 0;
};

// A list of option names in the order they were added. An iterator shares the list's store instead
// of copying it; a change to a shared store is made on a private copy, so that an iterator always
// walks the names as they stood when it was made (a matcher may be handed an iterator over the very
// list it fills). The components belong to the interpreter's thread; nothing here is locked.
class OptionNameList final : public IOptionNameList, public Port::Recycled<OptionNameList> {
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
    StoreRef m_names;  // null while the list has never held a name
};

// The identifier under which an iterator of this library answers with itself, so that the
// library's matcher reads its names in place instead of through copies. Not an interface of the
// system: another library's iterator does not know it and is read through IOptionNameIterator.
inline constexpr Port::XUIDLiteral OwnIteratorID{0x5b0e7d2c94a14f6eull, 0x8c3f61a0d27b9e45ull};

// Walks a shared store of names; it is also the candidate source that a matcher reads.
class OptionNameIterator final : public IOptionNameIterator,
                                 public IOptionNameSource,
                                 public Port::Recycled<OptionNameIterator> {
public:
    // The names it walks, as they stood when it was made; empty when there are none.
    const std::vector<Port_String>& Names() const noexcept;

    explicit OptionNameIterator(StoreRef names) noexcept;
    OptionNameIterator(const OptionNameIterator&) = delete;
    OptionNameIterator& operator=(const OptionNameIterator&) = delete;

    CitI::IInterface* GetInterface(const Port::XUID& id) override;

    Port_String Current() override;
    void First() override;
    void Next() override;
    bool IsDone() override;

private:
    CommonI::RefCounter m_counter{static_cast<IOptionNameIterator*>(this)};
    StoreRef m_names;
    std::size_t m_pos = 0;
};

}  // namespace ArgMatchKit
