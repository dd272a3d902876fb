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

bool InKelmar(std::string_view word) noexcept {
    return word.size() > kWordPrefix.size() && std::memcmp(word.data(), kWordPrefix.data(), kWordPrefix.size()) == 0;
}

std::string_view TextOf(Tcl_Obj* obj) noexcept {
    int length = 0;
    const char* text = Tcl_GetStringFromObj(obj, &length);
    return {text, static_cast<size_t>(length)};
}

// What the registry knows of a handle that has a command. Kept by handle, so that its bookkeeping
// never depends on a word, which a rename changes and which two interpreters may both rename to.
struct Record {
    Tcl_Interp* interp;
    Tcl_Command token;
    ValueKey key;
    std::string word;
};

struct Pending {
    PtrHandleBase* handle;
    Tcl_Interp* interp;
};

struct State {
    std::unordered_map<const PtrHandleBase*, Record> records;
    std::unordered_multimap<std::string, PtrHandleBase*, WordHash, std::equal_to<>> byWord;
    std::unordered_map<ValueKey, PtrHandleBase*, ValueKeyHash> byValue;
    std::vector<Pending> pending;
    std::size_t outside = 0;  // words that a rename moved out of ::kelmar::
    int depth = 0;            // object commands running now, nested ones included
};

thread_local State* t_state = nullptr;

void ThreadExit(ClientData);

State& TheState() {
    if (t_state == nullptr) {
        t_state = new State;
        Tcl_CreateThreadExitHandler(ThreadExit, nullptr);
    }
    return *t_state;
}

std::atomic<unsigned long> g_wordCounter{0};

void End(Handle* handle) {
    handle->ReleaseValue();
    delete handle;
}

// Ends the pending handles of `interp`, or all of them for a null interp. Ending one may make others
// pending (a wrapped object that lets go of its own handles), so it goes on until none is left.
void EndPendingOf(State& state, Tcl_Interp* interp) {
    std::vector<PtrHandleBase*> batch;
    for (;;) {
        batch.clear();
        std::erase_if(state.pending, [&](const Pending& p) {
            if (interp != nullptr && p.interp != interp) return false;
            batch.push_back(p.handle);
            return true;
        });
        if (batch.empty()) return;
        for (PtrHandleBase* handle : batch) End(handle);
    }
}

// The thread is done with Tcl (Tcl_FinalizeThread, also at the end of the process): what waits to be
// ended goes, and the state goes once no command is left that could still reach it.
void ThreadExit(ClientData) {
    State* state = t_state;
    if (state == nullptr) return;
    EndPendingOf(*state, nullptr);
    if (state->records.empty() && state->pending.empty()) {
        t_state = nullptr;
        delete state;
    }
}

void AddWord(State& state, const std::string& word, PtrHandleBase* handle) {
    state.byWord.emplace(word, handle);
    if (!InKelmar(word)) ++state.outside;
}

void DropWord(State& state, const std::string& word, const PtrHandleBase* handle) {
    auto [first, last] = state.byWord.equal_range(std::string_view(word));
    for (auto it = first; it != last; ++it) {
        if (it->second != handle) continue;
        state.byWord.erase(it);
        if (!InKelmar(word)) --state.outside;
        return;
    }
}

// Removes everything the state knows of a handle's command; gives the record that was dropped.
Record DropRecord(State& state, std::unordered_map<const PtrHandleBase*, Record>::iterator it) {
    const PtrHandleBase* handle = it->first;
    Record record = std::move(it->second);
    state.records.erase(it);
    DropWord(state, record.word, handle);
    if (auto value = state.byValue.find(record.key); value != state.byValue.end() && value->second == handle)
        state.byValue.erase(value);
    return record;
}

// The handle behind `word`; of `interp` first when two interpreters renamed a handle to one name.
PtrHandleBase* FindIn(const State& state, std::string_view word, Tcl_Interp* interp) {
    if (!InKelmar(word) && state.outside == 0) return nullptr;
    auto [first, last] = state.byWord.equal_range(word);
    if (first == last) return nullptr;
    if (interp != nullptr) {
        for (auto it = first; it != last; ++it) {
            auto record = state.records.find(it->second);
            if (record != state.records.end() && record->second.interp == interp) return it->second;
        }
    }
    return first->second;
}

// Counts the running object commands; the outermost one to return ends the pending handles.
class CallDepth {
public:
    explicit CallDepth(State& state) noexcept : m_state(state) { ++m_state.depth; }
    CallDepth(const CallDepth&) = delete;
    CallDepth& operator=(const CallDepth&) = delete;
    ~CallDepth() {
        if (--m_state.depth == 0 && !m_state.pending.empty()) EndPendingOf(m_state, nullptr);
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
    ArgumentVector(const State& state, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
        if (objc > kInline) {
            m_heapSlots = std::make_unique<Slot[]>(objc);
            m_heapArgs = std::make_unique<Handle*[]>(objc);
            m_slots = m_heapSlots.get();
            m_args = m_heapArgs.get();
        }
        for (int i = 0; i < objc; ++i) {
            PtrHandleBase* handle = i > 0 ? FindIn(state, TextOf(objv[i]), interp) : nullptr;
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

// A word that is no command of `interp` and no word of this thread yet, even where a rename took a
// name of the form the counter makes.
std::string MakeWord(const State& state, Tcl_Interp* interp, const char* typeName) {
    std::string word;
    do {
        word.assign(kWordPrefix);
        word += typeName != nullptr ? typeName : kDefaultTypeName;
        word += std::to_string(++g_wordCounter);
    } while (state.byWord.count(std::string_view(word)) != 0 ||
             Tcl_FindCommand(interp, word.c_str(), nullptr, TCL_GLOBAL_ONLY) != nullptr);
    return word;
}

}  // namespace

void HandleRegistry::SetWord(PtrHandleBase* handle, Tcl_Obj* word) {
    Tcl_IncrRefCount(word);
    if (handle->m_word != nullptr) Tcl_DecrRefCount(handle->m_word);
    handle->m_word = word;
}

Tcl_Obj* HandleRegistry::HandOver(PtrHandleBase* handle, Tcl_Interp* interp) {
    if (handle->m_word != nullptr) {
        Follow(handle);
        return handle->m_word;
    }
    State& state = TheState();
    if (interp == nullptr) {
        // Nobody can take it over; the support still owns it from here on.
        state.pending.push_back({handle, nullptr});
        return nullptr;
    }
    Attach(interp);

    const ValueKey key{interp, handle->m_value,
                       std::type_index(handle->m_identity != nullptr ? *handle->m_identity : typeid(*handle))};
    if (auto it = state.byValue.find(key); it != state.byValue.end()) {
        Follow(it->second);
        SetWord(handle, it->second->m_word);
        state.pending.push_back({handle, interp});
        return handle->m_word;
    }

    std::string word = MakeWord(state, interp, handle->m_typeName);
    Tcl_Command token = Tcl_CreateObjCommand(interp, word.c_str(), ObjectCommand, handle, CommandDeleted);
    if (token == nullptr) {
        state.pending.push_back({handle, interp});
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("cannot make the command \"%s\"", word.c_str()));
        return nullptr;
    }
    SetWord(handle, Tcl_NewStringObj(word.data(), static_cast<int>(word.size())));
    state.byValue.emplace(key, handle);
    AddWord(state, word, handle);
    state.records.emplace(handle, Record{interp, token, key, std::move(word)});
    return handle->m_word;
}

PtrHandleBase* HandleRegistry::Find(std::string_view word) {
    const State* state = t_state;
    return state != nullptr ? FindIn(*state, word, nullptr) : nullptr;
}

void HandleRegistry::Attach(Tcl_Interp* interp) {
    if (interp == nullptr) return;
    static int marker;
    if (Tcl_GetAssocData(interp, kAssocKey, nullptr) == &marker) return;
    Tcl_SetAssocData(interp, kAssocKey, InterpDeleted, &marker);
    if (Tcl_FindNamespace(interp, "::kelmar", nullptr, TCL_GLOBAL_ONLY) == nullptr) {
        Tcl_CreateNamespace(interp, "::kelmar", nullptr, nullptr);
    }
}

void HandleRegistry::Forget(PtrHandleBase* handle) {
    State* state = t_state;
    if (state == nullptr) return;
    for (auto it = state->pending.begin(); it != state->pending.end(); ++it) {
        if (it->handle == handle) {
            state->pending.erase(it);
            break;
        }
    }
    auto it = state->records.find(handle);
    if (it == state->records.end()) return;
    const Record record = DropRecord(*state, it);
    // The command must not outlive its handle; with the record gone its delete proc ends nothing.
    Tcl_DeleteCommandFromToken(record.interp, record.token);
}

void HandleRegistry::Rekey(PtrHandleBase* handle, void* oldValue) {
    State* state = t_state;
    if (state == nullptr || handle->m_value == oldValue) return;
    auto it = state->records.find(handle);
    if (it == state->records.end()) return;
    Record& record = it->second;
    if (auto value = state->byValue.find(record.key); value != state->byValue.end() && value->second == handle)
        state->byValue.erase(value);
    record.key.value = handle->m_value;
    state->byValue.emplace(record.key, handle);
}

void HandleRegistry::EndPending() {
    if (State* state = t_state) EndPendingOf(*state, nullptr);
}

int HandleRegistry::ObjectCommand(ClientData data, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    auto* handle = static_cast<PtrHandleBase*>(data);
    // Called by another name than its word: the command may have been renamed.
    if (objv[0] != handle->m_word && TextOf(objv[0]) != TextOf(handle->m_word)) Follow(handle);
    State& state = TheState();
    CallDepth depth(state);
    // Tcl is C: nothing may unwind through it.
    try {
        ArgumentVector args(state, interp, objc, objv);
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
    auto it = state.records.find(handle);
    if (it == state.records.end()) return;  // its destructor runs now
    const Record record = DropRecord(state, it);
    // A running command may still hold the handle in its argument vector.
    if (state.depth > 0) {
        state.pending.push_back({handle, record.interp});
    } else {
        End(handle);
    }
}

// The name of the command now, which a script may have changed by rename since the record was made.
// Asked for at hand-over and when the command is called by another name, rather than told by a
// command trace: Tcl 8.6 frees a command's next trace when an earlier one deletes the command
// during a rename, so a trace of ours would let any script's own trace crash the process.
void HandleRegistry::Follow(PtrHandleBase* handle) {
    State* state = t_state;
    if (state == nullptr) return;
    auto it = state->records.find(handle);
    if (it == state->records.end()) return;
    Record& record = it->second;
    Tcl_Obj* name = Tcl_NewObj();
    Tcl_IncrRefCount(name);
    Tcl_GetCommandFullName(record.interp, record.token, name);
    if (const std::string_view now = TextOf(name); !now.empty() && now != record.word) {
        DropWord(*state, record.word, handle);
        record.word = now;
        AddWord(*state, record.word, handle);
        SetWord(handle, name);
    }
    Tcl_DecrRefCount(name);
}

void HandleRegistry::InterpDeleted(ClientData, Tcl_Interp* interp) {
    State& state = TheState();
    if (state.depth == 0) EndPendingOf(state, interp);
}

}  // namespace Script
