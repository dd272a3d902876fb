// CitP::Factory and its init object. The class table and the library cache live in static storage
// that needs no dynamic initialisation: a component library may register its classes from its own
// static initialisers, before or after this library's. FactoryInit builds them in place on the
// first module and takes them down on the last; a call before any init object builds them on first
// use.
#include "CitP/Factory.h"

#include <dlfcn.h>

#include <cstring>
#include <new>
#include <vector>

#include "Port/Init.h"

namespace CitP {

namespace {

struct ClassEntry {
    uint64_t first;
    uint64_t second;
    ComponentCreator creator;
};

struct LibraryEntry {
    Port::StringBase<char> name;
    void* handle;  // never closed: registered creators point into the library
};

struct FactoryState {
    std::vector<ClassEntry> classes;
    std::vector<LibraryEntry> libraries;
};

alignas(FactoryState) unsigned char g_storage[sizeof(FactoryState)];
FactoryState* g_state = nullptr;
int g_inits = 0;
int g_libraryOpens = 0;
Factory::LoadFilter g_loadFilter = nullptr;
Factory::CreateFilter g_createFilter = nullptr;

FactoryState& StateUp() noexcept {
    if (!g_state) g_state = new (g_storage) FactoryState();
    return *g_state;
}

void TearDown() noexcept {
    if (!g_state) return;
    g_state->~FactoryState();
    g_state = nullptr;
}

ClassEntry* FindClass(FactoryState& state, const Port::XUID& classId) noexcept {
    for (ClassEntry& entry : state.classes) {
        if (entry.first == classId.First() && entry.second == classId.Second()) return &entry;
    }
    return nullptr;
}

// A matched method asks for its libraries on every call: the answer for a known name must cost a
// few comparisons and no allocation.
bool IsCached(const FactoryState& state, const Port::StringBase<char>& name) noexcept {
    const int32_t length = name.Length();
    for (const LibraryEntry& entry : state.libraries) {
        if (entry.name.Length() == length &&
            std::memcmp(entry.name.c_str(), name.c_str(), static_cast<size_t>(length)) == 0)
            return true;
    }
    return false;
}

// An address inside this library, for dladdr; internal, so it cannot be bound elsewhere.
void Anchor() {}

// The folder that holds this library, with its trailing slash; empty when it cannot be told, and
// then the loader's own search finds the component library.
Port::StringBase<char> LibraryFolder() {
    Dl_info info{};
    if (dladdr(reinterpret_cast<void*>(&Anchor), &info) == 0 || !info.dli_fname) return {};
    const char* slash = std::strrchr(info.dli_fname, '/');
    if (!slash) return {};
    return Port::StringBase<char>(info.dli_fname, static_cast<int32_t>(slash - info.dli_fname + 1));
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
    if (g_loadFilter && !g_loadFilter(name.c_str())) return false;
    if (IsCached(StateUp(), name)) return true;
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
    StateUp().libraries.push_back(LibraryEntry{name, handle});
    return true;
}

CommonI::RefCountPtr<CitI::IInterface> Factory::CreateInstanceRef(const Port::XUID& classId) {
    if (g_createFilter && !g_createFilter(classId)) return nullptr;
    const ClassEntry* entry = FindClass(StateUp(), classId);
    if (!entry || !entry->creator) return nullptr;
    // The new component starts at no references; the counted pointer takes the first.
    return CommonI::RefCountPtr<CitI::IInterface>(entry->creator());
}

void Factory::RegisterClass(const Port::XUID& classId, ComponentCreator creator) {
    FactoryState& state = StateUp();
    if (ClassEntry* entry = FindClass(state, classId)) {
        entry->creator = creator;
        return;
    }
    state.classes.push_back(ClassEntry{classId.First(), classId.Second(), creator});
}

bool Factory::IsRegistered(const Port::XUID& classId) {
    const ClassEntry* entry = FindClass(StateUp(), classId);
    return entry && entry->creator;
}

int Factory::LibraryOpenCount() { return g_libraryOpens; }

void Factory::SetLoadFilter(LoadFilter filter) { g_loadFilter = filter; }

void Factory::SetCreateFilter(CreateFilter filter) { g_createFilter = filter; }

FactoryInit::FactoryInit() {
    if (g_inits++ == 0) StateUp();
}

FactoryInit::~FactoryInit() {
    if (--g_inits == 0) TearDown();
}

int FactoryInitCount() noexcept { return g_inits; }

}  // namespace CitP
