// KitObject<I>: a counted kit object that implements the interface I. A concrete kit class overrides
// each operation of I with one line, KIT_OP(operation, arguments...): the operation's member
// pointer tells the types of its parameters, and from them Run knows which arguments are inputs
// to record, which are outs to fill and what to give back.
#pragma once

#include <cstddef>
#include <memory>
#include <string>
#include <type_traits>
#include <utility>

#include "ICommandHelp.h"
#include "kit_core.h"
#include "render.h"

namespace TestKit {

// The usage texts of an object made with -help: the template with every "%W" replaced by the word.
// Counted together with its object, which it forwards every question to.
class HelpText final : public ICommandHelp {
public:
    HelpText(CitI::IInterface* owner, std::string pattern, std::string faceName)
        : m_owner(owner), m_pattern(std::move(pattern)), m_faceName(std::move(faceName)) {}

    CitI::IInterface* GetInterface(const Port::XUID& id) override { return m_owner->GetInterface(id); }
    Port_String GetSummary() override;
    Port_String GetTopics() override;
    Port_String GetHelp(const Port_String& word) override;

private:
    CitI::IInterface* m_owner;
    std::string m_pattern;
    std::string m_faceName;
};

// Inputs are what an operation reads: by value, by const reference, and the inout component.
template <class P>
inline constexpr bool kIsInput = !std::is_lvalue_reference_v<P> || std::is_const_v<std::remove_reference_t<P>> ||
                                 std::is_same_v<P, CitI::MIInterface&>;

// The position of the last Port_String& parameter, or the parameter count when there is none.
template <class... P>
constexpr std::size_t LastMessage() {
    constexpr bool isMessage[] = {false, std::is_same_v<P, Port_String&>...};
    for (std::size_t n = sizeof...(P); n > 0; --n)
        if (isMessage[n]) return n - 1;
    return sizeof...(P);
}

template <class I>
class KitObject : public I, public KitCore {
public:
    using Face = I;

    explicit KitObject(const KitSetup& setup, std::string name = I::NAME)
        : KitCore(static_cast<I*>(this), std::move(name), setup) {
        if (setup.help) m_help = std::make_unique<HelpText>(this, setup.help, I::NAME);
    }

    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        if (id == I::IID || id == CitI::IInterfaceID) return static_cast<I*>(this);
        if (id == CommonI::IRefCountID) return &m_counter;
        if (id == ICommandHelpID && m_help) return m_help.get();
        return nullptr;
    }

protected:
    // Records the call, asks the handler, fills the outs and gives the operation's value.
    template <class R, class... P>
    R Run(R (I::*)(P...), const char* operation, std::type_identity_t<P>... args) {
        // A handler may delete the last wrapper of this object while the operation runs.
        const CitI::MIInterface alive(static_cast<I*>(this));
        TclRef call(Tcl_NewListObj(0, nullptr));
        Tcl_ListObjAppendElement(nullptr, call.get(), Tcl_NewStringObj(operation, -1));
        (RecordInput<P>(call.get(), args), ...);

        const std::optional<Outcome> said = Take(call.get());
        const Outcome* outcome = said ? &*said : nullptr;
        constexpr std::size_t last = LastMessage<P...>();
        [&]<std::size_t... N>(std::index_sequence<N...>) {
            (DeliverOutput<P>(args, N == last, outcome), ...);
        }(std::index_sequence_for<P...>{});
        return Give(std::type_identity<R>{}, outcome);
    }

private:
    template <class P, class A>
    static void RecordInput(Tcl_Obj* call, A& arg) {
        if constexpr (kIsInput<P>) Render(call, arg);
    }
    template <class P, class A>
    void DeliverOutput(A& arg, bool last, const Outcome* outcome) {
        if constexpr (!kIsInput<P>) Deliver(arg, last, outcome);
    }

    CommonI::RefCounter m_counter{this};
    std::unique_ptr<HelpText> m_help;
};

// A new kit object of class K, as the maker functions give it: uncounted, by its root interface.
template <class K>
CitI::IInterface* Make(const KitSetup& setup) {
    return static_cast<typename K::Face*>(new K(setup));
}

}  // namespace TestKit

// One operation of a kit class: `KIT_OP(get, name, result, message);` in the override's body.
#define KIT_OP(operation, ...) return Run(&Face::operation, #operation __VA_OPT__(, ) __VA_ARGS__)
