#include "HandleRegistry.h"

#include <atomic>
#include <cstring>
#include <exception>
#include <functional>
#include <memory>
#include <new>
#include <string>
#include <typeindex>
#include <unordered_map>
#include <vector>

namespace Script {
namespace {

constexpr std::string_view kWordPrefix = "::kelmar::";
constexpr const char* kAssocKey = "Kelmar::HandleRegistry";
constexpr const char* kDefaultTypeName = "Handle";

// One word per (interpreter, value, handle class): the same object under another interface has its
// own wrapper class and so its own word, and another interpreter needs a command of its own.
struct ValueKey {
    Tcl_Interp* interp;
    void* value;
    std::type_index type;

    bool operator==(const ValueKey&) const = default;
};

struct ValueKeyHash {
    size_t operator()(const ValueKey& key) const noexcept {
        size_t h = std::hash<const void*>{}(key.interp);
        h = h * 31 + std::hash<const void*>{}(key.value);
        return h * 31 + key.type.hash_code();
    }
};

// Lets the argument scan look a word up by the Tcl text itself, without making a std::string.
struct WordHash {
    using is_transparent = void;
    size_t operator()(std::string_view word) const noexcept { return std::hash<std::string_view>{}(word); }
};

struct Record {
    PtrHandleBase* handle;
    Tcl_Interp* interp;
    Tcl_Command token;
    ValueKey key;
};

struct Pending {
    PtrHandleBase* handle;
    Tcl_Interp* interp;
};

struct State {
    std::unordered_map<std::string, Record, WordHash, std::equal_to<>> byWord;
    std::unordered_map<ValueKey, PtrHandleBase*, ValueKeyHash> byValue;
    std::vector<Pending> pending;
    int depth = 0;  // object commands running now, nested ones included
    bool exitHandlerSet = false;
};

// Never destroyed: handles can still be ended while the process winds down.
State& TheState() {
    static State* state = new State;
    return *state;
}

std::atomic<unsigned long> g_wordCounter{0};

void End(Handle* handle) {
    handle->ReleaseValue();
    delete handle;
}

void EraseValueKey(State& state, const ValueKey& key, const PtrHandleBase* handle) {
    auto it = state.byValue.find(key);
    if (it != state.byValue.end() && it->second == handle) state.byValue.erase(it);
}

// Ends the pending handles of `interp`, or all of them for a null interp. Ending one may make others
// pending (a wrapped object that lets go of its own handles), so it goes on until none is left.
void EndPendingOf(Tcl_Interp* interp) {
    State& state = TheState();
    std::vector<PtrHandleBase*> batch;
    for (;;) {
        batch.clear();
        for (auto it = state.pending.begin(); it != state.pending.end();) {
            if (interp == nullptr || it->interp == interp) {
                batch.push_back(it->handle);
                it = state.pending.erase(it);
            } else {
                ++it;
            }
        }
        if (batch.empty()) return;
        for (PtrHandleBase* handle : batch) End(handle);
    }
}

// Counts the running object commands; the outermost one to return ends the pending handles.
class CallDepth {
public:
    CallDepth() noexcept : m_state(TheState()) { ++m_state.depth; }
    CallDepth(const CallDepth&) = delete;
    CallDepth& operator=(const CallDepth&) = delete;
    ~CallDepth() {
        if (--m_state.depth == 0 && !m_state.pending.empty()) EndPendingOf(nullptr);
    }

private:
    State& m_state;
};

// A plain argument word as a handle, borrowing the caller's Tcl_Obj: objv outlives the call, so no
// reference needs to be taken.
class BorrowedValueHandle final : public TclObjHandleBase {
public:
    explicit BorrowedValueHandle(Tcl_Obj* obj) noexcept : m_borrowed(obj) {}
    BorrowedValueHandle(const BorrowedValueHandle&) = delete;
    BorrowedValueHandle& operator=(const BorrowedValueHandle&) = delete;

    Tcl_Obj* GetTclObj() override { return m_borrowed; }

private:
    Tcl_Obj* m_borrowed;
};

// The argument vector of one object command call. Value handles live in a local buffer; only calls
// with more words than it holds go to the heap.
class ArgumentVector {
public:
    ArgumentVector(int objc, Tcl_Obj* const objv[]) {
        if (objc > kInline) {
            m_heapSlots = std::make_unique<Slot[]>(objc);
            m_heapArgs = std::make_unique<Handle*[]>(objc);
            m_slots = m_heapSlots.get();
            m_args = m_heapArgs.get();
        }
        for (int i = 0; i < objc; ++i) {
            PtrHandleBase* handle = i > 0 ? PtrHandleBase::GetHandleFromTclObj(objv[i]) : nullptr;
            if (handle != nullptr) {
                m_args[i] = handle;
            } else {
                m_args[i] = ::new (static_cast<void*>(m_slots[m_values].bytes)) BorrowedValueHandle(objv[i]);
                ++m_values;
            }
        }
    }
    ArgumentVector(const ArgumentVector&) = delete;
    ArgumentVector& operator=(const ArgumentVector&) = delete;
    ~ArgumentVector() {
        for (int i = 0; i < m_values; ++i) {
            std::launder(reinterpret_cast<BorrowedValueHandle*>(m_slots[i].bytes))->~BorrowedValueHandle();
        }
    }

    Handle* const* Data() const noexcept { return m_args; }

private:
    static constexpr int kInline = 16;
    struct Slot {
        alignas(BorrowedValueHandle) unsigned char bytes[sizeof(BorrowedValueHandle)];
    };

    Slot m_inlineSlots[kInline];
    Handle* m_inlineArgs[kInline];
    Slot* m_slots = m_inlineSlots;
    Handle** m_args = m_inlineArgs;
    int m_values = 0;
    std::unique_ptr<Slot[]> m_heapSlots;
    std::unique_ptr<Handle*[]> m_heapArgs;
};

std::string MakeWord(Tcl_Interp* interp, const char* typeName) {
    std::string word;
    do {
        word.assign(kWordPrefix);
        word += typeName != nullptr ? typeName : kDefaultTypeName;
        word += std::to_string(++g_wordCounter);
    } while (Tcl_FindCommand(interp, word.c_str(), nullptr, TCL_GLOBAL_ONLY) != nullptr);
    return word;
}

}  // namespace

std::string_view HandleRegistry::WordOf(const PtrHandleBase* handle) {
    int length = 0;
    const char* text = Tcl_GetStringFromObj(handle->m_word, &length);
    return {text, static_cast<size_t>(length)};
}

Tcl_Obj* HandleRegistry::HandOver(PtrHandleBase* handle, Tcl_Interp* interp) {
    if (handle->m_word != nullptr) return handle->m_word;
    State& state = TheState();
    if (interp == nullptr) {
        // Nobody can take it over; the support still owns it from here on.
        state.pending.push_back({handle, nullptr});
        return nullptr;
    }
    Attach(interp);

    const ValueKey key{interp, handle->m_value, std::type_index(typeid(*handle))};
    if (auto it = state.byValue.find(key); it != state.byValue.end()) {
        handle->m_word = it->second->m_word;
        Tcl_IncrRefCount(handle->m_word);
        state.pending.push_back({handle, interp});
        return handle->m_word;
    }

    std::string word = MakeWord(interp, handle->m_typeName);
    Tcl_Command token = Tcl_CreateObjCommand(interp, word.c_str(), ObjectCommand, handle, CommandDeleted);
    if (token == nullptr) {
        state.pending.push_back({handle, interp});
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("cannot make the command \"%s\"", word.c_str()));
        return nullptr;
    }
    handle->m_word = Tcl_NewStringObj(word.data(), static_cast<int>(word.size()));
    Tcl_IncrRefCount(handle->m_word);
    state.byValue.emplace(key, handle);
    state.byWord.emplace(std::move(word), Record{handle, interp, token, key});
    return handle->m_word;
}

PtrHandleBase* HandleRegistry::Find(std::string_view word) {
    if (word.size() <= kWordPrefix.size() || std::memcmp(word.data(), kWordPrefix.data(), kWordPrefix.size()) != 0) {
        return nullptr;
    }
    const State& state = TheState();
    auto it = state.byWord.find(word);
    return it == state.byWord.end() ? nullptr : it->second.handle;
}

void HandleRegistry::Attach(Tcl_Interp* interp) {
    if (interp == nullptr) return;
    static int marker;
    if (Tcl_GetAssocData(interp, kAssocKey, nullptr) == &marker) return;
    Tcl_SetAssocData(interp, kAssocKey, InterpDeleted, &marker);
    if (Tcl_FindNamespace(interp, "::kelmar", nullptr, TCL_GLOBAL_ONLY) == nullptr) {
        Tcl_CreateNamespace(interp, "::kelmar", nullptr, nullptr);
    }
    State& state = TheState();
    if (!state.exitHandlerSet) {
        state.exitHandlerSet = true;
        Tcl_CreateExitHandler(ProcessExit, nullptr);
    }
}

void HandleRegistry::Forget(PtrHandleBase* handle) {
    State& state = TheState();
    for (auto it = state.pending.begin(); it != state.pending.end(); ++it) {
        if (it->handle == handle) {
            state.pending.erase(it);
            break;
        }
    }
    if (handle->m_word == nullptr) return;
    auto it = state.byWord.find(WordOf(handle));
    if (it == state.byWord.end() || it->second.handle != handle) return;
    const Record record = it->second;
    EraseValueKey(state, record.key, handle);
    state.byWord.erase(it);
    // The command must not outlive its handle; with the record gone its delete proc ends nothing.
    Tcl_DeleteCommandFromToken(record.interp, record.token);
}

void HandleRegistry::Rekey(PtrHandleBase* handle, void* oldValue) {
    if (handle->m_word == nullptr || handle->m_value == oldValue) return;
    State& state = TheState();
    auto it = state.byWord.find(WordOf(handle));
    if (it == state.byWord.end() || it->second.handle != handle) return;
    Record& record = it->second;
    EraseValueKey(state, record.key, handle);
    record.key.value = handle->m_value;
    state.byValue.emplace(record.key, handle);
}

void HandleRegistry::EndPending() { EndPendingOf(nullptr); }

int HandleRegistry::ObjectCommand(ClientData data, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    auto* handle = static_cast<PtrHandleBase*>(data);
    CallDepth depth;
    ArgumentVector args(objc, objv);
    // Tcl is C: nothing may unwind through it.
    try {
        return handle->Execute(objc, args.Data(), interp);
    } catch (const std::exception& e) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("%s: %s", Tcl_GetString(objv[0]), e.what()));
    } catch (...) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("%s: unexpected exception", Tcl_GetString(objv[0])));
    }
    return TCL_ERROR;
}

void HandleRegistry::CommandDeleted(ClientData data) {
    auto* handle = static_cast<PtrHandleBase*>(data);
    State& state = TheState();
    auto it = state.byWord.find(WordOf(handle));
    if (it == state.byWord.end() || it->second.handle != handle) return;  // its destructor runs now
    Tcl_Interp* interp = it->second.interp;
    EraseValueKey(state, it->second.key, handle);
    state.byWord.erase(it);
    // A running command may still hold the handle in its argument vector.
    if (state.depth > 0) {
        state.pending.push_back({handle, interp});
    } else {
        End(handle);
    }
}

void HandleRegistry::InterpDeleted(ClientData, Tcl_Interp* interp) {
    if (TheState().depth == 0) EndPendingOf(interp);
}

void HandleRegistry::ProcessExit(ClientData) { EndPendingOf(nullptr); }

}  // namespace Script
