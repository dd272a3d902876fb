// Port::XUID: a 128-bit identifier of an interface or a component class.
#pragma once

#include <cstdint>
#include <new>

#include "Port/StringBase.h"

namespace Port {

// The two halves of an identifier as a compile-time constant. Every use turns it into a temporary
// XUID; no identifier is a shared object.
struct XUIDLiteral {
    uint64_t first;
    uint64_t second;
};

class XUID {
public:
    XUID() noexcept : m_first(0), m_second(0), m_flag(0) {}
    XUID(uint64_t first, uint64_t second) noexcept : m_first(first), m_second(second), m_flag(0) {}
    XUID(const XUIDLiteral& literal) noexcept  // NOLINT: literals convert where an id is due
        : m_first(literal.first), m_second(literal.second), m_flag(0) {}
    // From the canonical text form "xxxxxxxx-xxxx-xxxx-xxxx-xxxxxxxxxxxx" (either case, optional
    // braces). A text that is no identifier gives the all-zero identifier.
    explicit XUID(const char* text) noexcept;
    XUID(const XUID&) noexcept = default;
    XUID& operator=(const XUID&) noexcept = default;
    // Inline, so that the temporary made from a literal at every GetInterface costs no call.
    virtual ~XUID() = default;

    uint64_t First() const noexcept { return m_first; }
    uint64_t Second() const noexcept { return m_second; }
    bool IsNull() const noexcept { return m_first == 0 && m_second == 0; }

    // The canonical lower-case text form, 8-4-4-4-12 hex digits.
    StringBase<char> ToString() const;

    // Equal when both halves are equal; the flag byte takes no part.
    friend bool operator==(const XUID& a, const XUID& b) noexcept {
        return a.m_first == b.m_first && a.m_second == b.m_second;
    }
    friend bool operator==(const XUID& a, const XUIDLiteral& b) noexcept {
        return a.m_first == b.first && a.m_second == b.second;
    }

private:
    uint64_t m_first;
    uint64_t m_second;
    uint8_t m_flag;
};

// A function that builds an identifier into uninitialised storage and gives the same pointer back.
using XUIDFunction = XUID* (*)(XUID* storage);

template <const XUIDLiteral& L>
XUID* BuildXUID(XUID* storage) {
    return new (storage) XUID(L);
}

}  // namespace Port
