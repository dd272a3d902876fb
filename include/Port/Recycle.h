// Port::Recycled<T>: memory of a component class kept for the next instance made on the same thread.
//
// A call of a script makes and ends a handful of small components (properties, a matcher, its name
// lists); taking each from the heap and giving it back costs more than the rest of their life. A
// class that derives from Recycled<T> takes its blocks from a per-thread list of blocks of its own
// size, filled by the instances that ended on that thread, and gives back to the heap what exceeds
// the list's length and, when the thread ends, the whole list. Construction and destruction are
// untouched: an instance is born and ends at the same moment as before, only its memory is reused.
//
// Under AddressSanitizer every block goes to the heap and back, so that a use after the end of an
// instance is still reported.
#pragma once

#include <cstddef>
#include <new>

namespace Port {

// Thread-local state on the call path is reached without a call into the dynamic loader: the few
// bytes come from the static block that the loader keeps for libraries opened later.
#if defined(__GNUC__)
#define KELMAR_FAST_TLS [[gnu::tls_model("initial-exec")]]
#else
#define KELMAR_FAST_TLS
#endif

#if defined(__SANITIZE_ADDRESS__)
inline constexpr bool kRecycleBlocks = false;
#else
inline constexpr bool kRecycleBlocks = true;
#endif

// Up to N pointers per thread, put aside for later use by the same thread. The shelf itself needs
// no construction, so reaching it costs no guard and no call; the first Put of a thread arms a
// closer that, when the thread ends, hands every pointer left to Owner::Discard and closes the
// shelf, so that a Put after that fails and the caller frees what it holds.
template <class Owner, std::size_t N>
class ThreadShelf {
public:
    static void* Take() noexcept {
        Slots& slots = Mine();
        return slots.count > 0 ? slots.items[--slots.count] : nullptr;
    }
    static bool Put(void* item) noexcept {
        Slots& slots = Mine();
        if (slots.closed || slots.count >= N) return false;
        if (!slots.armed && !Arm()) return false;
        slots.items[slots.count++] = item;
        return true;
    }

private:
    struct Slots {
        void* items[N];
        std::size_t count;
        bool armed;
        bool closed;
    };
    struct Closer {
        ~Closer() {
            Slots& slots = Mine();
            while (slots.count > 0) Owner::Discard(slots.items[--slots.count]);
            slots.closed = true;
        }
    };
    static Slots& Mine() noexcept {
        KELMAR_FAST_TLS static thread_local constinit Slots slots{};
        return slots;
    }
    static bool Arm() noexcept {
        try {
            static thread_local Closer closer;
            (void)closer;
        } catch (...) {
            return false;
        }
        Mine().armed = true;
        return true;
    }
};

template <class T, std::size_t Keep = 16>
class Recycled {
public:
    static void* operator new(std::size_t size) {
        if (void* block = Take(size)) return block;
        return ::operator new(size);
    }
    static void* operator new(std::size_t size, const std::nothrow_t&) noexcept {
        if (void* block = Take(size)) return block;
        return ::operator new(size, std::nothrow);
    }
    static void operator delete(void* block, std::size_t size) noexcept {
        if (block != nullptr && !Give(block, size)) ::operator delete(block);
    }
    static void operator delete(void* block, const std::nothrow_t&) noexcept { ::operator delete(block); }

    // The end of a block left on the shelf when its thread ends.
    static void Discard(void* block) noexcept { ::operator delete(block); }

private:
    using Shelf = ThreadShelf<Recycled, Keep>;
    // A derived class of another size asks the heap.
    static void* Take(std::size_t size) noexcept {
        if constexpr (!kRecycleBlocks) return nullptr;
        return size == sizeof(T) ? Shelf::Take() : nullptr;
    }
    static bool Give(void* block, std::size_t size) noexcept {
        if constexpr (!kRecycleBlocks) return false;
        return size == sizeof(T) && Shelf::Put(block);
    }
};

}  // namespace Port
