// CitP::InstanceTable and its init object. The table lives in static storage that needs no
// dynamic initialisation: InstanceTableInit builds it in place on the first module and takes it
// down on the last, and a call before any module's init object builds it on first use. The
// observer is plain data, so a death reported during static teardown still reaches it.
#include "CitP/InstanceTable.h"

#include <new>
#include <vector>

#include "Port/Init.h"

namespace CitP {

namespace {

struct LiveCount {
    uint64_t first;
    uint64_t second;
    long live;
};
using Table = std::vector<LiveCount>;

alignas(Table) unsigned char g_storage[sizeof(Table)];
Table* g_table = nullptr;
int g_inits = 0;
InstanceTable::Observer g_observer = nullptr;
void* g_observerContext = nullptr;

Table& TableUp() noexcept {
    if (!g_table) g_table = new (g_storage) Table();
    return *g_table;
}

void TearDown() noexcept {
    if (!g_table) return;
    g_table->~Table();
    g_table = nullptr;
}

LiveCount* Find(Table& table, const Port::XUID& classId) noexcept {
    for (LiveCount& entry : table) {
        if (entry.first == classId.First() && entry.second == classId.Second()) return &entry;
    }
    return nullptr;
}

// Counting is a diagnosis: when no memory is left for a new class's row, that class goes uncounted
// rather than failing the component's construction or destruction.
void Count(const Port::XUID& classId, long change) noexcept {
    Table& table = TableUp();
    if (LiveCount* entry = Find(table, classId)) {
        entry->live += change;
        return;
    }
    try {
        table.push_back(LiveCount{classId.First(), classId.Second(), change});
    } catch (...) {
    }
}

}  // namespace

void InstanceTable::Born(const Port::XUID& classId) noexcept { Count(classId, 1); }

void InstanceTable::Died(const Port::XUID& classId, const char* detail) noexcept {
    // Without a table nothing was born since it came down (or ever), and a death late in static
    // teardown must not build the table anew.
    if (g_table) Count(classId, -1);
    if (g_observer) g_observer(classId, detail, g_observerContext);
}

long InstanceTable::Live(const Port::XUID& classId) noexcept {
    if (!g_table) return 0;
    const LiveCount* entry = Find(*g_table, classId);
    return entry ? entry->live : 0;
}

void InstanceTable::SetObserver(Observer observer, void* context) noexcept {
    g_observer = observer;
    g_observerContext = observer ? context : nullptr;
}

InstanceTableInit::InstanceTableInit() {
    if (g_inits++ == 0) TableUp();
}

InstanceTableInit::~InstanceTableInit() {
    if (--g_inits == 0) TearDown();
}

int InstanceTableInitCount() noexcept { return g_inits; }

}  // namespace CitP
