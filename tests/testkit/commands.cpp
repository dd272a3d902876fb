// The Tcl commands of the test kit, in the namespace ::testkit, and the library's entry.
#include <tcl.h>

#include <exception>
#include <string>

#include "CitI/IScriptHandle.h"
#include "Port/Init.h"
#include "Script/Handle.h"
#include "Script/TclWrapFactory.h"
#include "kit_kinds.h"
#include "watch.h"

namespace TestKit {

namespace {

// This module uses the portability layer like every other: it holds the layer up while loaded.
Port::FileInit g_fileInit;
Port::PathListInit g_pathListInit;
CitP::InstanceTableInit g_instanceTableInit;
CitP::FactoryInit g_factoryInit;

int Fail(Tcl_Interp* interp, const std::string& message) {
    Tcl_SetObjResult(interp, Tcl_NewStringObj(message.data(), static_cast<int>(message.size())));
    return TCL_ERROR;
}

std::string Quoted(Tcl_Obj* word) { return std::string("\"") + Tcl_GetString(word) + "\""; }

const TaskKind* KindOf(Tcl_Interp* interp, Tcl_Obj* word) {
    const TaskKind* kind = FindTaskKind(Tcl_GetString(word));
    if (!kind) Fail(interp, "unknown interface " + Quoted(word));
    return kind;
}

// Wraps `object` by the factory registered under `id` and makes the wrapper's word the result. The
// wrapper takes its own reference; the caller's may go afterwards.
int HandOver(Tcl_Interp* interp, const Port::XUID& id, CitI::IInterface* object, const char* what) {
    CitI::IInterface* made = Script::TclWrapFactory::CreateInstance(id, object, interp);
    auto* handle = made ? static_cast<CitI::IScriptHandle*>(made->GetInterface(CitI::IScriptHandleID)) : nullptr;
    if (!handle) return Fail(interp, std::string("no wrapper factory gave a handle for ") + what);
    handle->SetResult(interp);
    return TCL_OK;
}

// The kit object behind a handle's word: the wrapper's pointer leads to it through the registry.
KitCore* KitBehind(Tcl_Interp* interp, Tcl_Obj* word) {
    Script::PtrHandleBase* handle = Script::PtrHandleBase::GetHandleFromTclObj(word);
    void* face = nullptr;
    KitCore* kit = handle && handle->GetValue(&face) == 0 ? KitCore::Find(face) : nullptr;
    if (!kit) Fail(interp, "no kit object behind " + Quoted(word));
    return kit;
}

using Args = Tcl_Obj* const*;

int New(Tcl_Interp* interp, int objc, Args objv) {
    const TaskKind* kind = KindOf(interp, objv[1]);
    if (!kind) return TCL_ERROR;
    static const char* const kOptions[] = {"-handler", "-help", nullptr};
    KitSetup setup{interp};
    for (int at = 2; at < objc; at += 2) {
        int option = 0;
        if (Tcl_GetIndexFromObj(interp, objv[at], kOptions, "option", 0, &option) != TCL_OK) return TCL_ERROR;
        if (at + 1 == objc) return Fail(interp, std::string("value for \"") + kOptions[option] + "\" missing");
        Tcl_Obj* value = objv[at + 1];
        if (option == 0) {
            int words = 0;
            if (Tcl_ListObjLength(interp, value, &words) != TCL_OK) return TCL_ERROR;
            setup.handler = value;
        } else {
            setup.help = Tcl_GetString(value);
        }
    }
    // Held until the wrapper has taken its own reference: should no wrapper come, the object goes.
    const CitI::MIInterface object(kind->make(setup));
    return HandOver(interp, kind->id, object.get(), kind->name);
}

int Calls(Tcl_Interp* interp, int, Args objv) {
    KitCore* kit = KitBehind(interp, objv[1]);
    if (!kit) return TCL_ERROR;
    Tcl_SetObjResult(interp, kit->Calls());
    return TCL_OK;
}

int Reset(Tcl_Interp* interp, int, Args objv) {
    KitCore* kit = KitBehind(interp, objv[1]);
    if (!kit) return TCL_ERROR;
    kit->ForgetCalls();
    return TCL_OK;
}

int Orphan(Tcl_Interp* interp, int, Args objv) {
    const TaskKind* kind = KindOf(interp, objv[1]);
    if (!kind) return TCL_ERROR;
    return HandOver(interp, kind->id, OrphanOf(*kind), kind->name);
}

int Helper(Tcl_Interp* interp, int, Args objv) {
    // The scripting support owns the handle from here on.
    auto* handle = new Script::PtrHandle<Dpm::IProjectHelper>(HelperNamed(Tcl_GetString(objv[1])), interp);
    handle->SetResult(interp);
    return TCL_OK;
}

int Component(Tcl_Interp* interp, int, Args objv) {
    const CitI::MIInterface component(MakeComponent(Tcl_GetString(objv[1]), interp));
    return HandOver(interp, CitI::IInterfaceID, component.get(), "a component");
}

int Live(Tcl_Interp* interp, int, Args) {
    Tcl_SetObjResult(interp, LiveCounts());
    return TCL_OK;
}

int Events(Tcl_Interp* interp, int, Args) {
    Tcl_SetObjResult(interp, TakeEvents());
    return TCL_OK;
}

int Fault(Tcl_Interp* interp, int, Args objv) {
    static const char* const kStates[] = {"on", "off", nullptr};
    int state = 0;
    if (Tcl_GetIndexFromObj(interp, objv[2], kStates, "state", TCL_EXACT, &state) != TCL_OK) return TCL_ERROR;
    std::string error;
    if (!SetFault(Tcl_GetString(objv[1]), state == 0, error)) return Fail(interp, error);
    return TCL_OK;
}

using Body = int (*)(Tcl_Interp*, int, Args);

struct Command {
    const char* name;
    Body body;
    int least;  // words behind the command name
    int most;   // -1 for no limit
    const char* usage;
};

constexpr Command kCommands[] = {
    {"new", &New, 1, -1, "IFACE ?-handler CMD? ?-help TEMPLATE?"},
    {"calls", &Calls, 1, 1, "WORD"},
    {"reset", &Reset, 1, 1, "WORD"},
    {"orphan", &Orphan, 1, 1, "IFACE"},
    {"helper", &Helper, 1, 1, "NAME"},
    {"component", &Component, 1, 1, "NAME"},
    {"live", &Live, 0, 0, ""},
    {"events", &Events, 0, 0, ""},
    {"fault", &Fault, 2, 2, "WHAT on|off"},
};

// Checks the count of words, then runs the body; a C++ exception becomes a Tcl error.
int Dispatch(ClientData data, Tcl_Interp* interp, int objc, Args objv) {
    const auto* command = static_cast<const Command*>(data);
    const int given = objc - 1;
    if (given < command->least || (command->most >= 0 && given > command->most)) {
        Tcl_WrongNumArgs(interp, 1, objv, command->usage);
        return TCL_ERROR;
    }
    try {
        return command->body(interp, objc, objv);
    } catch (const std::exception& failure) {
        return Fail(interp, std::string("testkit: ") + failure.what());
    }
}

}  // namespace

}  // namespace TestKit

extern "C" {

// The kit reaches Tcl through the stub table of the Tcl that loads it, and works with the package of
// its own version only.
int Tcltaski_testkit_Init(Tcl_Interp* interp) {
    if (Tcl_InitStubs(interp, "8.6", 0) == nullptr) return TCL_ERROR;
    if (Tcl_PkgRequire(interp, "TcltaskI_Morvane", KELMAR_VERSION, 1) == nullptr) return TCL_ERROR;
    TestKit::StartWatching();
    if (!Tcl_FindNamespace(interp, "::testkit", nullptr, 0))
        Tcl_CreateNamespace(interp, "::testkit", nullptr, nullptr);
    for (const TestKit::Command& command : TestKit::kCommands) {
        const std::string name = std::string("::testkit::") + command.name;
        Tcl_CreateObjCommand(interp, name.c_str(), &TestKit::Dispatch,
                             const_cast<TestKit::Command*>(&command), nullptr);
    }
    return Tcl_PkgProvide(interp, "TcltaskI_TestKit", KELMAR_VERSION);
}

// The kit makes no file or process of its own, so a safe interpreter may have it too.
int Tcltaski_testkit_SafeInit(Tcl_Interp* interp) { return Tcltaski_testkit_Init(interp); }

}
