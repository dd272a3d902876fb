// CommonI::IRefCount: the interface through which every reference is counted. It is always found
// by GetInterface with its identifier; an object that does not answer to it is not counted.
#pragma once

#include <cstdint>

#include "CitI/IInterface.h"

namespace CommonI {

// The result of an operation. In matched methods 1 is success.
using RESULT = int64_t;

inline constexpr Port::XUIDLiteral IRefCountID{0xf35246530fb84605ull, 0xa6c16e80946a2cddull};

class IRefCount : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IRefCountID;
    static constexpr const char* NAME = "IRefCount";

    virtual long AddRef() = 0;
    virtual long Release() = 0;
};

// The counting part of a component: the component answers IRefCountID with its counter, which
// forwards GetInterface to the component and deletes it when the last reference goes. A component
// starts at zero references; the first counted pointer to it takes the first.
class RefCounter final : public IRefCount {
public:
    explicit RefCounter(CitI::IInterface* owner) noexcept : m_owner(owner) {}
    RefCounter(const RefCounter&) = delete;
    RefCounter& operator=(const RefCounter&) = delete;

    CitI::IInterface* GetInterface(const Port::XUID& id) override { return m_owner->GetInterface(id); }
    long AddRef() override { return ++m_count; }
    long Release() override {
        const long left = --m_count;
        if (left == 0) delete m_owner;  // destroys this counter too; nothing is touched after
        return left;
    }
    long Count() const noexcept { return m_count; }

private:
    CitI::IInterface* m_owner;
    long m_count = 0;
};

}  // namespace CommonI
