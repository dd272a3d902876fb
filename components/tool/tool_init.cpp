// Brings the tool up in an interpreter: its state, the root object commands (projmgr, project,
// collection, settings, obj, view, highlight, selection, search, timing, floorplan) and the
// convenience commands kelmartool::open and kelmartool::help, all in the namespace ::kelmartool.
// Loading creates no global command: a root word such as `selection` may already be a command of
// the interpreter (Tk's). The roots, and only they, are exported, so that
// `namespace import ::kelmartool::*` brings them in and Tcl refuses to replace a command that exists.
#include <tcl.h>

#include <algorithm>
#include <cstring>
#include <exception>
#include <string>
#include <string_view>
#include <vector>

#include "TcltaskI/ICollection.h"
#include "TcltaskI/IGlobal.h"
#include "TcltaskI/IGraphicalView.h"
#include "TcltaskI/IHighlight.h"
#include "TcltaskI/IObject.h"
#include "TcltaskI/ISearch.h"
#include "TcltaskI/ISelection.h"
#include "TcltaskI/ITclProjectMgr.h"
#include "TcltaskI/ITimingAnalysis.h"
#include "TcltaskI/IXFloorplan.h"
#include "TcltaskKit/Module.h"
#include "TcltaskKit/Publish.h"
#include "project.h"
#include "roots.h"
#include "scene/scene_commands.h"

namespace {

// This module uses the portability layer, so it holds it up like every other module.
TcltaskKit::ModuleInit s_portLayer;

constexpr const char* kStateKey = "kelmartool";

void DeleteState(ClientData data, Tcl_Interp*) {
    auto* state = static_cast<kelmartool::StatePtr*>(data);
    (*state)->Shutdown();
    delete state;
}

constexpr const char* kToolNamespace = "::kelmartool";

// A root command: ::kelmartool::`root` runs its object's command, the word held here, as an alias
// would, without the alias's second trip through the interpreter (a sixth of a tool call). While the
// word names the object command it was made for, the command's procedure is called directly, with
// the word in place of the root's name; once a script has deleted or replaced that command, the
// word is evaluated as an alias evaluates its target, with the same errors.
struct RootTarget {
    Tcl_Obj* word;            // the object's command word, with a reference
    Tcl_ObjCmdProc* native;   // the procedure of that command when the root was made
};

void DeleteRootTarget(ClientData data) {
    auto* target = static_cast<RootTarget*>(data);
    Tcl_DecrRefCount(target->word);
    delete target;
}

int RootCommand(ClientData data, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    const auto* target = static_cast<const RootTarget*>(data);
    constexpr int kInline = 16;
    Tcl_Obj* inlineWords[kInline];
    std::vector<Tcl_Obj*> heapWords;
    Tcl_Obj** words = inlineWords;
    if (objc > kInline) {
        heapWords.resize(static_cast<std::size_t>(objc));
        words = heapWords.data();
    }
    words[0] = target->word;
    std::copy(objv + 1, objv + objc, words + 1);
    Tcl_CmdInfo info;
    const Tcl_Command command = Tcl_GetCommandFromObj(interp, target->word);
    if (command != nullptr && Tcl_GetCommandInfoFromToken(command, &info) && info.objProc == target->native)
        return info.objProc(info.objClientData, interp, objc, words);
    return Tcl_EvalObjv(interp, objc, words, TCL_EVAL_INVOKE);
}

// The object command word of a root, or null.
Tcl_Obj* RootWord(Tcl_Interp* interp, const char* root) {
    const std::string name = std::string(kToolNamespace) + "::" + root;
    Tcl_CmdInfo info;
    if (!Tcl_GetCommandInfo(interp, name.c_str(), &info) || info.objProc != &RootCommand) return nullptr;
    return static_cast<const RootTarget*>(info.objClientData)->word;
}

// Hands a new object to Tcl under its interface and makes ::kelmartool::`root` the root command of
// the wrapper's word; an object that cannot be handed over ends here.
bool Publish(Tcl_Interp* interp, const char* root, const Port::XUID& id, CitI::IInterface* made) {
    if (!TcltaskKit::HandToTcl(interp, id, made)) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("cannot hand the %s object to Tcl: %s", root, Tcl_GetStringResult(interp)));
        return false;
    }
    Tcl_Obj* word = Tcl_DuplicateObj(Tcl_GetObjResult(interp));
    Tcl_IncrRefCount(word);
    Tcl_ResetResult(interp);
    Tcl_CmdInfo info;
    if (!Tcl_GetCommandInfo(interp, Tcl_GetString(word), &info)) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("the %s object has no command \"%s\"", root, Tcl_GetString(word)));
        Tcl_DecrRefCount(word);
        return false;
    }
    const std::string name = std::string(kToolNamespace) + "::" + root;
    Tcl_CreateObjCommand(interp, name.c_str(), RootCommand, new RootTarget{word, info.objProc}, DeleteRootTarget);
    return true;
}

// kelmartool::open FILE: opens a design file as the current project; the message on success.
int OpenCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc != 2) {
        Tcl_WrongNumArgs(interp, 1, objv, "file");
        return TCL_ERROR;
    }
    // Called by Tcl directly, not through the package's frames: nothing may be thrown past here.
    try {
        kelmartool::StatePtr state = kelmartool::StateOf(interp);
        CommonI::RefCountPtr<TcltaskI::ITclProjectMgr> manager(static_cast<TcltaskI::ITclProjectMgr*>(
            kelmartool::NewProjectManager(state)->GetInterface(TcltaskI::ITclProjectMgrID)));
        Port_String message;
        const char* file = Tcl_GetString(objv[1]);
        const CommonI::RESULT ok = manager->Open(file, message);
        Tcl_SetObjResult(interp, Tcl_NewStringObj(message.c_str(), message.Length()));
        if (ok == 1) return TCL_OK;
        // The manager answers its failures as values, with no error code: a file is refused when it
        // cannot be read or understood, and only an empty word is no file at all.
        if (file[0] == '\0')
            kelmartool::SetRefusal(*state, kelmartool::Refusal::Value);
        else
            kelmartool::SetRefusal(*state, kelmartool::Refusal::File, {file});
        return TCL_ERROR;
    } catch (const std::exception& e) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("cannot open the project file: %s", e.what()));
        return TCL_ERROR;
    }
}

// The root words and the interfaces behind them, in the order a user meets them.
struct Root {
    const char* word;
    const char* interfaceName;
};
constexpr Root kRoots[] = {
    {"projmgr", TcltaskI::ITclProjectMgr::NAME},   {"project", TcltaskI::ITclProject::NAME},
    {"collection", TcltaskI::ICollection::NAME},   {"settings", TcltaskI::IGlobal::NAME},
    {"obj", TcltaskI::IObject::NAME},              {"view", TcltaskI::IGraphicalView::NAME},
    {"highlight", TcltaskI::IHighlight::NAME},     {"selection", TcltaskI::ISelection::NAME},
    {"search", TcltaskI::ISearch::NAME},           {"timing", TcltaskI::ITimingAnalysis::NAME},
    {"floorplan", TcltaskI::IXFloorplan::NAME},
};

// The interface a help word is about: a root word, or the word of an object of one of the roots'
// interfaces, with or without its namespace (`::kelmar::ICollection3` or `ICollection3`, as a wrong
// count names it). An object word is the interface's name followed by a number.
const char* InterfaceOf(std::string_view word) {
    for (const Root& root : kRoots)
        if (word == root.word) return root.interfaceName;
    constexpr std::string_view kNamespace = "::kelmar::";
    if (word.starts_with(kNamespace)) word.remove_prefix(kNamespace.size());
    const std::size_t end = word.find_last_not_of("0123456789");
    if (end == std::string_view::npos || end + 1 == word.size()) return nullptr;
    const std::string_view type = word.substr(0, end + 1);
    for (const Root& root : kRoots)
        if (type == root.interfaceName) return root.interfaceName;
    return nullptr;
}

// Why a word is neither a root nor an object help knows, with what help does know.
Tcl_Obj* UnknownHelpWord(const char* word) {
    std::string roots, interfaces;
    for (const Root& root : kRoots) {
        roots += std::string(roots.empty() ? "" : " ") + root.word;
        interfaces += std::string(interfaces.empty() ? "" : " ") + root.interfaceName;
    }
    return Tcl_ObjPrintf("no root command or object of the tool is named \"%s\": give a root (%s) or an object of "
                         "their interfaces (%s)",
                         word, roots.c_str(), interfaces.c_str());
}

// kelmartool::help ?ROOT? ?WORD?: the root words with what they are, the command words of
// one root or object, or the usage of one command word; the same texts a wrong call shows.
int HelpCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc > 3) {
        Tcl_WrongNumArgs(interp, 1, objv, "?root|object? ?word?");
        return TCL_ERROR;
    }
    if (objc == 1) {
        Tcl_Obj* list = Tcl_NewListObj(0, nullptr);
        for (const Root& root : kRoots) {
            CommonI::RefCountPtr<ICommandHelp> help(kelmartool::NewCommandHelp(root.interfaceName));
            Tcl_ListObjAppendElement(interp, list, Tcl_NewStringObj(root.word, -1));
            Tcl_ListObjAppendElement(interp, list, Tcl_NewStringObj(help->GetSummary().c_str(), -1));
        }
        Tcl_SetObjResult(interp, list);
        return TCL_OK;
    }
    const char* word = Tcl_GetString(objv[1]);
    const char* interfaceName = InterfaceOf(word);
    if (interfaceName == nullptr) {
        Tcl_SetObjResult(interp, UnknownHelpWord(word));
        return TCL_ERROR;
    }
    CommonI::RefCountPtr<ICommandHelp> help(kelmartool::NewCommandHelp(interfaceName));
    const Port_String text = objc == 2 ? help->GetTopics() : help->GetHelp(Tcl_GetString(objv[2]));
    Tcl_SetObjResult(interp, Tcl_NewStringObj(text.c_str(), text.Length()));
    return TCL_OK;
}

// kelmartool::object ROOT: the command word of a root's object (`::kelmar::ICollection3` for
// collection), the word that wrong-count messages and help name.
int ObjectCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc != 2) {
        Tcl_WrongNumArgs(interp, 1, objv, "root");
        return TCL_ERROR;
    }
    const char* root = Tcl_GetString(objv[1]);
    bool known = false;
    for (const Root& each : kRoots) known = known || std::strcmp(each.word, root) == 0;
    Tcl_Obj* word = known ? RootWord(interp, root) : nullptr;
    if (word == nullptr) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("\"%s\" is no root command of the tool in this interpreter", root));
        return TCL_ERROR;
    }
    Tcl_SetObjResult(interp, word);
    return TCL_OK;
}

}  // namespace

namespace kelmartool {

StatePtr StateOf(Tcl_Interp* interp) {
    auto* state = static_cast<StatePtr*>(Tcl_GetAssocData(interp, kStateKey, nullptr));
    return state ? *state : nullptr;
}

}  // namespace kelmartool

// The tool reaches Tcl through the stub table of the Tcl that loads it, and works with the package
// of its own version only.
extern "C" __attribute__((visibility("default"))) int Kelmartool_Init(Tcl_Interp* interp) {
    if (Tcl_InitStubs(interp, "8.6", 0) == nullptr) return TCL_ERROR;
    if (Tcl_PkgRequire(interp, "TcltaskI_Morvane", KELMAR_VERSION, 1) == nullptr) return TCL_ERROR;
    if (kelmartool::StateOf(interp)) return Tcl_PkgProvide(interp, "KelmarTool", KELMAR_VERSION);

    auto* holder = new kelmartool::StatePtr(std::make_shared<kelmartool::ToolState>(interp));
    Tcl_SetAssocData(interp, kStateKey, DeleteState, holder);
    const kelmartool::StatePtr& state = *holder;

    using namespace kelmartool;
    const bool published =
        Publish(interp, "projmgr", TcltaskI::ITclProjectMgrID, NewProjectManager(state)) &&
        Publish(interp, "project", TcltaskI::ITclProjectID, NewCurrentProject(state)) &&
        Publish(interp, "collection", TcltaskI::ICollectionID, NewCollection(state)) &&
        Publish(interp, "settings", TcltaskI::IGlobalID, NewGlobal(state)) &&
        Publish(interp, "obj", TcltaskI::IObjectID, NewObjectQuery(state)) &&
        Publish(interp, "view", TcltaskI::IGraphicalViewID, NewView(state)) &&
        Publish(interp, "highlight", TcltaskI::IHighlightID, NewHighlight(state)) &&
        Publish(interp, "selection", TcltaskI::ISelectionID, NewSelection(state)) &&
        Publish(interp, "search", TcltaskI::ISearchID, NewSearch(state)) &&
        Publish(interp, "timing", TcltaskI::ITimingAnalysisID, NewTimingAnalysis(state)) &&
        Publish(interp, "floorplan", TcltaskI::IXFloorplanID, NewFloorplan(state));
    if (!published) return TCL_ERROR;

    // The export list is the roots and nothing else, whatever a script put there before.
    Tcl_Namespace* space = Tcl_FindNamespace(interp, kToolNamespace, nullptr, TCL_LEAVE_ERR_MSG);
    if (space == nullptr) return TCL_ERROR;
    for (const Root& root : kRoots)
        if (Tcl_Export(interp, space, root.word, &root == kRoots) != TCL_OK) return TCL_ERROR;

    // Not exported: the package's wrong-count messages ask for `help`, which is the shell's to
    // make (kelmarsh makes it an alias of kelmartool::help).
    Tcl_CreateObjCommand(interp, "::kelmartool::open", OpenCommand, nullptr, nullptr);
    Tcl_CreateObjCommand(interp, "::kelmartool::help", HelpCommand, nullptr, nullptr);
    Tcl_CreateObjCommand(interp, "::kelmartool::object", ObjectCommand, nullptr, nullptr);
    kelmartool::CreateSceneCommands(interp);
    Tcl_CreateObjCommand(interp, "::kelmartool::read_netlist", kelmartool::ReadNetlistCommand, nullptr, nullptr);
    return Tcl_PkgProvide(interp, "KelmarTool", KELMAR_VERSION);
}
