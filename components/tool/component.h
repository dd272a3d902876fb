// The counted base of every interface object of the tool. An object answers GetInterface for its
// interfaces, for CitI::IInterface, for CommonI::IRefCount with its counter and for ICommandHelp with
// the usage texts of its primary interface, so that no object repeats that code.
#pragma once

#include "CommonI/IRefCount.h"
#include "CommonI/RefCountPtr.h"
#include "ICommandHelp.h"

namespace kelmartool {

// The help of one interface (help.cpp): usage lines of its command words, by the interface's NAME.
// Counted; no reference taken yet.
ICommandHelp* NewCommandHelp(const char* interfaceName);

template <class F>
concept HasInterfaceId = requires { F::IID; };

// Primary is the interface whose usage texts the object offers; Faces are further interfaces. A
// face without an identifier (Dpm::IProjectHelper) travels as a raw pointer only and is not found
// by GetInterface.
template <class Primary, class... Faces>
class Component : public Primary, public Faces... {
public:
    Component() : m_counter(static_cast<Primary*>(this)), m_help(NewCommandHelp(Primary::NAME)) {}
    Component(const Component&) = delete;
    Component& operator=(const Component&) = delete;
    ~Component() override = default;

    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        if (id == Primary::IID || id == CitI::IInterfaceID) return static_cast<Primary*>(this);
        if (id == CommonI::IRefCountID) return &m_counter;
        if (id == ICommandHelpID) return m_help.get();
        CitI::IInterface* face = nullptr;
        ((face = face != nullptr ? face : FaceOf<Faces>(id)), ...);
        return face;
    }

    // The object as its root interface, for handing on as CitI::IInterface.
    CitI::IInterface* Root() noexcept { return static_cast<Primary*>(this); }

private:
    template <class F>
    CitI::IInterface* FaceOf(const Port::XUID& id) {
        if constexpr (HasInterfaceId<F>) {
            if (id == F::IID) return static_cast<F*>(this);
        }
        return nullptr;
    }

    CommonI::RefCounter m_counter;
    CommonI::RefCountPtr<ICommandHelp> m_help;
};

// A counted pointer that takes the first reference of a new component.
template <class I, class C>
CommonI::RefCountPtr<I> Adopt(C* component) {
    return CommonI::RefCountPtr<I>(static_cast<I*>(component));
}

}  // namespace kelmartool
