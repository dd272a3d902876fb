// CitP::InstanceTable: counts the live instances of each component class and tells an observer of
// each end of life, so that a leak of a component can be seen from outside.
#pragma once

#include "Port/XUID.h"

namespace CitP {

class InstanceTable {
public:
    using Observer = void (*)(const Port::XUID& classId, const char* detail, void* context);

    static void Born(const Port::XUID& classId) noexcept;
    // `detail` is a short text about the instance (may be null).
    static void Died(const Port::XUID& classId, const char* detail) noexcept;
    static long Live(const Port::XUID& classId) noexcept;

    // One observer at a time; null removes it.
    static void SetObserver(Observer observer, void* context) noexcept;
};

}  // namespace CitP
