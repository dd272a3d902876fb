// The counted base of an interface object. An object made on it answers GetInterface for its
// interfaces, for CitI::IInterface, for CommonI::IRefCount with its counter and for ICommandHelp with
// the help it was given, so that no object writes that code again:
//
//     class MapCollection final : public TcltaskKit::Component<TcltaskI::ICollection> { ... };
//
// Counting: a new object has no reference. The first CommonI::RefCountPtr to it (or the wrapper the
// package makes when it is handed to Tcl) takes the first one; when the last reference goes, the
// object is deleted. Hold the objects you keep in counted pointers and never delete one yourself.
#pragma once

#include <utility>

#include "CommonI/IRefCount.h"
#include "CommonI/RefCountPtr.h"
#include "ICommandHelp.h"

namespace TcltaskKit {

template <class F>
concept HasInterfaceId = requires { F::IID; };

// Primary is the interface the object is handed to Tcl under, and its root as CitI::IInterface;
// Faces are further interfaces. A face without an identifier travels as a raw pointer only and is
// not found by GetInterface.
template <class Primary, class... Faces>
class Component : public Primary, public Faces... {
public:
    // `help` may be null: the package's messages then carry no usage text.
    explicit Component(CommonI::RefCountPtr<ICommandHelp> help = {})
        : m_counter(static_cast<Primary*>(this)), m_help(std::move(help)) {}
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

}  // namespace TcltaskKit
