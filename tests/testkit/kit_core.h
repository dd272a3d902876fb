// What every object of the test kit shares: its name, the calls that reached it, the script handler
// that decides what its operations do, and the registry that leads from a wrapper's face pointer back
// to the object.
#pragma once

#include <tcl.h>

#include <array>
#include <optional>
#include <string>
#include <type_traits>
#include <vector>

#include "CommonI/RefCountPtr.h"
#include "Dpm/IProjectHelper.h"
#include "HdcI/IHDProject.h"
#include "TcltaskI/ITclProject.h"
#include "UtilI/ITclProperty.h"
#include "tcl_ref.h"

namespace TestKit {

// How the handler wants an object handed out: none, a new one each call, or one kept per kit object.
enum class Made { Null, New, Same };

// What a handler's answer says an operation does; the defaults are those of an empty answer.
struct Outcome {
    int64_t code = 1;
    std::optional<std::string> value;
    std::optional<std::string> message;
    std::string string;
    Made object = Made::Null;
    std::string helper;
};

// The objects an operation can hand out of its own accord.
enum class ObjectKind { TclProject, HDProject, Component };
inline constexpr std::size_t kObjectKinds = 3;

struct KitSetup {
    Tcl_Interp* interp = nullptr;  // where the handler runs
    Tcl_Obj* handler = nullptr;    // a command prefix; null or empty for none
    const char* help = nullptr;    // the usage template; null when the object offers no help
};

class KitCore {
public:
    // `face` is the pointer a wrapper holds for this object; null keeps it out of the registry.
    KitCore(const void* face, std::string name, const KitSetup& setup);
    ~KitCore();
    KitCore(const KitCore&) = delete;
    KitCore& operator=(const KitCore&) = delete;

    const std::string& Name() const noexcept { return m_name; }
    // The recorded calls, oldest first, as a new list.
    Tcl_Obj* Calls() const;
    void ForgetCalls() noexcept;

    // The live kit object a wrapper's pointer leads to, or null.
    static KitCore* Find(const void* face) noexcept;
    // Kit objects alive now, those that live for the process included.
    static long Live() noexcept;

protected:
    // Keeps the call (a list: operation, then the rendered inputs). Without a handler there is no
    // outcome; with one, its answer. A handler error or an answer that says nothing sensible throws.
    std::optional<Outcome> Take(Tcl_Obj* call);
    // The object of `kind` that `made` asks for, counted for the caller.
    CitI::MIInterface Provide(ObjectKind kind, Made made);

    // What an operation hands back through an out argument, given the handler's outcome or null
    // when there is no handler. `last` tells the last string argument, the one `message` fills.
    void Deliver(Port_String& text, bool last, const Outcome* outcome);
    void Deliver(UtilI::MITclProperty& property, bool last, const Outcome* outcome);
    void Deliver(CommonI::RefCountPtr<TcltaskI::ITclProject>& project, bool last, const Outcome* outcome);
    void Deliver(HdcI::MIHDProject& project, bool last, const Outcome* outcome);
    void Deliver(Dpm::IProjectHelper*& helper, bool last, const Outcome* outcome);

    // What an operation gives as its value, the same way.
    int64_t Give(std::type_identity<int64_t>, const Outcome* outcome);
    Port_String Give(std::type_identity<Port_String>, const Outcome* outcome);
    HdcI::MIHDProject Give(std::type_identity<HdcI::MIHDProject>, const Outcome* outcome);
    CitI::MIInterface Give(std::type_identity<CitI::MIInterface>, const Outcome* outcome);
    Dpm::IProjectHelper* Give(std::type_identity<Dpm::IProjectHelper*>, const Outcome* outcome);

private:
    Outcome RunHandler(Tcl_Obj* call);

    const void* m_face;
    std::string m_name;
    Tcl_Interp* m_interp;
    TclRef m_handler;
    std::vector<TclRef> m_calls;
    std::array<CitI::MIInterface, kObjectKinds> m_same;
};

// Reads a handler's answer; throws when it is no dict or holds a key or value the kit does not know.
Outcome ReadOutcome(Tcl_Obj* answer);

}  // namespace TestKit
