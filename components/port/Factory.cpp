// CitP::Factory and its init object. The class table and the library cache live in static storage
// that needs no dynamic initialisation: a component library may register its classes from its own
// static initialisers, before or after this library's. FactoryInit counts the modules that hold the
// factory up and takes the tables down with the last one.
//
// Threads: every interpreter thread asks the factory on every matched call, so lookups take no lock.
// Both tables are lists that only grow while the factory is up; a new entry is published with one
// atomic store, and an entry's creator is an atomic pointer, so that a reader sees either the old or
// the new creator. Writers take a lock among themselves; nobody holds it while a library is opened,
// since the library's own initialisers register their classes.
#include "CitP/Factory.h"

#include <dlfcn.h>

#include <atomic>
#include <cstring>
#include <mutex>
#include <type_traits>

#include "Port/Folder.h"
#include "Port/Init.h"

namespace CitP {

namespace {

struct ClassEntry {
    uint64_t first;
    uint64_t second;
    std::atomic<ComponentCreator> creator;
    ClassEntry* next;
};

struct LibraryEntry {
    Port::StringBase<char> name;
    void* handle;  // never closed: registered creators point into the library
    LibraryEntry* next;
};

// The classes, spread over buckets by their identifier, so that a lookup walks a handful of entries
// however many classes the libraries register.
constexpr size_t kClassBuckets = 64;
std::atomic<ClassEntry*> g_classes[kClassBuckets]{};
std::atomic<LibraryEntry*> g_libraries{nullptr};
std::atomic<int> g_inits{0};
std::atomic<int> g_libraryOpens{0};
std::atomic<Factory::LoadFilter> g_loadFilter{nullptr};
std::atomic<Factory::CreateFilter> g_createFilter{nullptr};

// Writers take this lock among themselves. It lives in static storage with no constructor or
// destructor to run, so it is there for a registration during another library's static
// initialisation or teardown, and it is no block of memory that an unloaded library would leave
// behind.
constinit std::mutex g_writerLock;
static_assert(std::is_trivially_destructible_v<std::mutex>);

std::mutex& WriterLock() { return g_writerLock; }

template <class Entry>
void FreeList(std::atomic<Entry*>& head) noexcept {
    Entry* entry = head.exchange(nullptr, std::memory_order_acq_rel);
    while (entry) {
        Entry* next = entry->next;
        delete entry;
        entry = next;
    }
}

std::atomic<ClassEntry*>& BucketOf(const Port::XUID& classId) noexcept {
    const uint64_t mixed = classId.First() ^ (classId.Second() * 0x9e3779b97f4a7c15ull);
    return g_classes[(mixed >> 58) % kClassBuckets];
}

void TearDown() noexcept {
    for (auto& bucket : g_classes) FreeList(bucket);
    FreeList(g_libraries);
}

ClassEntry* FindClass(const Port::XUID& classId) noexcept {
    for (ClassEntry* entry = BucketOf(classId).load(std::memory_order_acquire); entry; entry = entry->next) {
        if (entry->first == classId.First() && entry->second == classId.Second()) return entry;
    }
    return nullptr;
}

// A matched method asks for its libraries on every call: the answer for a known name must cost a
// few comparisons and no allocation.
bool IsCached(const Port::StringBase<char>& name) noexcept {
    const int32_t length = name.Length();
    for (LibraryEntry* entry = g_libraries.load(std::memory_order_acquire); entry; entry = entry->next) {
        if (entry->name.Length() == length &&
            std::memcmp(entry->name.c_str(), name.c_str(), static_cast<size_t>(length)) == 0)
            return true;
    }
    return false;
}

template <class Entry>
void Publish(std::atomic<Entry*>& head, Entry* entry) noexcept {
    entry->next = head.load(std::memory_order_relaxed);
    head.store(entry, std::memory_order_release);
}

// An address inside this library, for dladdr; internal, so it cannot be bound elsewhere.
void Anchor() {}

// The folder that holds this library, with its trailing slash; empty when it cannot be told, and
// then the loader's own search finds the component library.
Port::StringBase<char> LibraryFolder() {
    const std::string folder = Port::FolderOf(reinterpret_cast<const void*>(&Anchor));
    return Port::StringBase<char>(folder.data(), static_cast<int32_t>(folder.size()));
}

Port::StringBase<char> LibraryPath(const Port::StringBase<char>& name) {
    if (std::memchr(name.c_str(), '/', static_cast<size_t>(name.Length()))) return name;
    Port::StringBase<char> path = LibraryFolder();
    path += name;
    path += ".so";
    return path;
}

}  // namespace

bool Factory::LoadLibraryFactory(const Port::StringBase<char>& name) {
    if (LoadFilter filter = g_loadFilter.load(std::memory_order_acquire); filter && !filter(name.c_str())) return false;
    if (IsCached(name)) return true;
    // A name with a nul inside would open another file than the one the cache keeps it for.
    if (name.IsEmpty() || std::strlen(name.c_str()) != static_cast<size_t>(name.Length())) return false;

    const Port::StringBase<char> path = LibraryPath(name);
    void* handle = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (!handle) return false;
    ++g_libraryOpens;
    void* symbol = dlsym(handle, kRegisterFunctionName);
    if (!symbol) {
        dlclose(handle);
        return false;
    }
    // Should registration throw, the library stays open and uncached: some of its creators may
    // already be in the table.
    reinterpret_cast<RegisterFunction>(symbol)();
    const std::lock_guard hold(WriterLock());
    // Another thread may have opened it meanwhile; the loader counts the opens, one entry is enough.
    if (IsCached(name)) return true;
    Publish(g_libraries, new LibraryEntry{name, handle, nullptr});
    return true;
}

CommonI::RefCountPtr<CitI::IInterface> Factory::CreateInstanceRef(const Port::XUID& classId) {
    if (CreateFilter filter = g_createFilter.load(std::memory_order_acquire); filter && !filter(classId)) return nullptr;
    const ClassEntry* entry = FindClass(classId);
    const ComponentCreator creator = entry ? entry->creator.load(std::memory_order_acquire) : nullptr;
    if (!creator) return nullptr;
    // The new component starts at no references; the counted pointer takes the first.
    return CommonI::RefCountPtr<CitI::IInterface>(creator());
}

void Factory::RegisterClass(const Port::XUID& classId, ComponentCreator creator) {
    const std::lock_guard hold(WriterLock());
    if (ClassEntry* entry = FindClass(classId)) {
        entry->creator.store(creator, std::memory_order_release);
        return;
    }
    Publish(BucketOf(classId), new ClassEntry{classId.First(), classId.Second(), {creator}, nullptr});
}

bool Factory::IsRegistered(const Port::XUID& classId) {
    const ClassEntry* entry = FindClass(classId);
    return entry && entry->creator.load(std::memory_order_acquire);
}

int Factory::LibraryOpenCount() { return g_libraryOpens; }

void Factory::SetLoadFilter(LoadFilter filter) { g_loadFilter.store(filter, std::memory_order_release); }

void Factory::SetCreateFilter(CreateFilter filter) { g_createFilter.store(filter, std::memory_order_release); }

FactoryInit::FactoryInit() { ++g_inits; }

FactoryInit::~FactoryInit() {
    if (--g_inits == 0) {
        const std::lock_guard hold(WriterLock());
        TearDown();
    }
}

int FactoryInitCount() noexcept { return g_inits; }

}  // namespace CitP
