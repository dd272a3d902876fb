// CommonI::RefCountPtr<T>: a counted pointer. Counting goes through CommonI::IRefCount, asked for by
// identifier; an object without it is held uncounted.
#pragma once

#include <utility>

#include "CommonI/IRefCount.h"

namespace CommonI {

template <class T>
class RefCountPtr {
public:
    RefCountPtr() noexcept : m_ptr(nullptr) {}
    RefCountPtr(std::nullptr_t) noexcept : m_ptr(nullptr) {}  // NOLINT
    // Takes a reference on p.
    explicit RefCountPtr(T* p) noexcept : m_ptr(p) { AddRefTo(m_ptr); }
    // Takes a reference on p only when addRef is true.
    RefCountPtr(T* p, bool addRef) noexcept : m_ptr(p) {
        if (addRef) AddRefTo(m_ptr);
    }
    RefCountPtr(const RefCountPtr& other) noexcept : m_ptr(other.m_ptr) { AddRefTo(m_ptr); }
    RefCountPtr(RefCountPtr&& other) noexcept : m_ptr(std::exchange(other.m_ptr, nullptr)) {}
    // From a counted pointer of another interface: asks the source for T's identifier.
    template <class U>
    explicit RefCountPtr(const RefCountPtr<U>& other) noexcept
        : m_ptr(other.get() ? static_cast<T*>(other.get()->GetInterface(T::IID)) : nullptr) {
        AddRefTo(m_ptr);
    }
    ~RefCountPtr() { DropRefTo(m_ptr); }

    // Adds the reference to the new pointer before dropping the old one.
    RefCountPtr& operator=(const RefCountPtr& other) noexcept {
        T* p = other.m_ptr;
        AddRefTo(p);
        T* old = m_ptr;
        m_ptr = p;
        DropRefTo(old);
        return *this;
    }
    RefCountPtr& operator=(RefCountPtr&& other) noexcept {
        if (this != &other) {
            T* old = m_ptr;
            m_ptr = std::exchange(other.m_ptr, nullptr);
            DropRefTo(old);
        }
        return *this;
    }
    RefCountPtr& operator=(std::nullptr_t) noexcept {
        Release();
        return *this;
    }

    // Stores p without adding a reference, then drops the reference to the old pointer.
    void Attach(T* p) noexcept {
        T* old = m_ptr;
        m_ptr = p;
        DropRefTo(old);
    }
    // Gives the pointer up together with its reference.
    T* Detach() noexcept { return std::exchange(m_ptr, nullptr); }
    // Drops the reference held and becomes null.
    void Release() noexcept {
        T* old = std::exchange(m_ptr, nullptr);
        DropRefTo(old);
    }

    T* get() const noexcept { return m_ptr; }
    T* operator->() const noexcept { return m_ptr; }
    T& operator*() const noexcept { return *m_ptr; }
    explicit operator bool() const noexcept { return m_ptr != nullptr; }
    bool operator!() const noexcept { return m_ptr == nullptr; }
    friend bool operator==(const RefCountPtr& a, std::nullptr_t) noexcept { return a.m_ptr == nullptr; }

private:
    static IRefCount* CounterOf(T* p) noexcept {
        return p ? static_cast<IRefCount*>(p->GetInterface(IRefCountID)) : nullptr;
    }
    static void AddRefTo(T* p) noexcept {
        if (IRefCount* c = CounterOf(p)) c->AddRef();
    }
    static void DropRefTo(T* p) noexcept {
        if (IRefCount* c = CounterOf(p)) c->Release();
    }

    T* m_ptr;
};

}  // namespace CommonI

namespace CitI {
using MIInterface = CommonI::RefCountPtr<IInterface>;
}
