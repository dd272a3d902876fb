// CitP::InstanceTable and its init object. The table lives in static storage that needs no dynamic
// initialisation, so that a component born or dead during another library's static initialisation
// or teardown is still counted. InstanceTableInit counts the modules that hold it up; the last one
// takes the table down.
//
// Threads: components are born and die on every interpreter thread, so counting takes no lock. The
// table is a list that only grows while it is up: a class's row is published with one atomic store
// and its count is atomic. Rows are added under a lock among writers. The observer and its context
// are one pair, swapped whole.
#include "CitP/InstanceTable.h"

#include <atomic>
#include <mutex>
#include <type_traits>
#include <utility>
#include <new>

#include "Port/Init.h"

namespace CitP {

namespace {

struct LiveCount {
    uint64_t first;
    uint64_t second;
    std::atomic<long> live;
    LiveCount* next;
};

struct Watcher {
    InstanceTable::Observer observer;
    void* context;
    const Watcher* retired;  // the pair this one replaced, kept reachable
};

std::atomic<LiveCount*> g_table{nullptr};
std::atomic<int> g_inits{0};
std::atomic<const Watcher*> g_watcher{nullptr};
const Watcher* g_retired = nullptr;  // replaced pairs, under the writers' lock

// Writers take this lock among themselves. It lives in static storage with no constructor or
// destructor to run, so it is there for a registration during another library's static
// initialisation or teardown, and it is no block of memory that an unloaded library would leave
// behind.
constinit std::mutex g_writerLock;
static_assert(std::is_trivially_destructible_v<std::mutex>);

std::mutex& WriterLock() { return g_writerLock; }

LiveCount* Find(const Port::XUID& classId) noexcept {
    for (LiveCount* entry = g_table.load(std::memory_order_acquire); entry; entry = entry->next) {
        if (entry->first == classId.First() && entry->second == classId.Second()) return entry;
    }
    return nullptr;
}

// Under the writers' lock. The observer goes with the table: a death after this tells nobody.
void TearDown() noexcept {
    LiveCount* entry = g_table.exchange(nullptr, std::memory_order_acq_rel);
    while (entry) {
        LiveCount* next = entry->next;
        delete entry;
        entry = next;
    }
    delete g_watcher.exchange(nullptr, std::memory_order_acq_rel);
    while (g_retired) delete std::exchange(g_retired, g_retired->retired);
}

// Counting is a diagnosis: when no memory is left for a new class's row, that class goes uncounted
// rather than failing the component's construction or destruction.
void Count(const Port::XUID& classId, long change) noexcept {
    if (LiveCount* entry = Find(classId)) {
        entry->live.fetch_add(change, std::memory_order_relaxed);
        return;
    }
    const std::lock_guard hold(WriterLock());
    if (LiveCount* entry = Find(classId)) {
        entry->live.fetch_add(change, std::memory_order_relaxed);
        return;
    }
    auto* entry = new (std::nothrow) LiveCount{classId.First(), classId.Second(), {change}, nullptr};
    if (!entry) return;
    entry->next = g_table.load(std::memory_order_relaxed);
    g_table.store(entry, std::memory_order_release);
}

}  // namespace

void InstanceTable::Born(const Port::XUID& classId) noexcept { Count(classId, 1); }

void InstanceTable::Died(const Port::XUID& classId, const char* detail) noexcept {
    // Without a row nothing of the class was counted since the table came down (or ever), and a
    // death late in static teardown must not build the table anew.
    if (LiveCount* entry = Find(classId)) entry->live.fetch_sub(1, std::memory_order_relaxed);
    if (const Watcher* watcher = g_watcher.load(std::memory_order_acquire))
        watcher->observer(classId, detail, watcher->context);
}

long InstanceTable::Live(const Port::XUID& classId) noexcept {
    const LiveCount* entry = Find(classId);
    return entry ? entry->live.load(std::memory_order_relaxed) : 0;
}

// A replaced pair is kept, not freed: another thread may be calling its observer right now. Tests
// set the observer a handful of times in a process.
void InstanceTable::SetObserver(Observer observer, void* context) noexcept {
    const Watcher* watcher = observer ? new (std::nothrow) Watcher{observer, context, nullptr} : nullptr;
    const std::lock_guard hold(WriterLock());
    const Watcher* old = g_watcher.exchange(watcher, std::memory_order_acq_rel);
    if (old) {
        const_cast<Watcher*>(old)->retired = g_retired;
        g_retired = old;
    }
}

InstanceTableInit::InstanceTableInit() { ++g_inits; }

InstanceTableInit::~InstanceTableInit() {
    if (--g_inits == 0) {
        const std::lock_guard hold(WriterLock());
        TearDown();
    }
}

int InstanceTableInitCount() noexcept { return g_inits; }

}  // namespace CitP
