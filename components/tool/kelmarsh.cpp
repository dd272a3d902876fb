// kelmarsh: the tool's Tcl shell.
//
//   kelmarsh ?-project FILE? ?script.tcl? ?arg ...?
//
// Loads the tool package from the lib folder beside the shell's bin folder, imports its root
// commands and makes `help`, opens FILE as the current project when given, then runs the script,
// or reads commands at a prompt.
#include <tcl.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

namespace {

const char* g_project = nullptr;

// The message of a failed script once, then the trace of where it failed. An error of the package
// puts its text into the result and adds it to errorInfo, which then begins with the text twice.
void ReportScriptError(Tcl_Interp* interp) {
    const std::string message = Tcl_GetStringResult(interp);
    const char* info = Tcl_GetVar2(interp, "errorInfo", nullptr, TCL_GLOBAL_ONLY);
    std::string trace = info != nullptr ? info : message;
    if (!message.empty() && trace.compare(0, 2 * message.size(), message + message) == 0)
        trace.erase(0, message.size());
    std::fprintf(stderr, "%s\n", trace.c_str());
}

// A script given on the command line runs here rather than in Tcl_Main, so that its failure is told
// by ReportScriptError. The shell ends with the script, as Tcl's own does: 0, or 1 on failure.
void RunScript(Tcl_Interp* interp) {
    const char* encoding = nullptr;
    Tcl_Obj* script = Tcl_GetStartupScript(&encoding);
    if (script == nullptr) return;
    Tcl_IncrRefCount(script);
    const int code = Tcl_FSEvalFileEx(interp, script, encoding);
    Tcl_DecrRefCount(script);
    if (code != TCL_OK) {
        ReportScriptError(interp);
        Tcl_Exit(1);
    }
    Tcl_Exit(0);
}

int AppInit(Tcl_Interp* interp) {
    if (Tcl_Init(interp) != TCL_OK) return TCL_ERROR;
    // The tool keeps its roots in ::kelmartool; the shell imports them one by one, so that a name
    // taken already (by a package on the path, say) costs that name alone, and says so. `help` is
    // what the package's wrong-count messages ask for.
    static const char* const kSetup =
        "lappend ::auto_path [file join [file dirname [file dirname [file normalize [info nameofexecutable]]]] lib]\n"
        "package require KelmarTool\n"
        "apply {{} {\n"
        "    foreach root [namespace eval ::kelmartool {namespace export}] {\n"
        "        if {[catch {namespace import ::kelmartool::$root} why]} {\n"
        "            puts stderr \"kelmarsh: $root is not imported: $why; use ::kelmartool::$root\"\n"
        "        }\n"
        "    }\n"
        "    if {[info commands ::help] eq {}} {\n"
        "        interp alias {} ::help {} ::kelmartool::help\n"
        "    } else {\n"
        "        puts stderr \"kelmarsh: help is not made: a command of that name exists; use ::kelmartool::help\"\n"
        "    }\n"
        "}}\n"
        "set ::tcl_prompt1 {puts -nonewline \"kelmarsh% \"; flush stdout}\n";
    if (Tcl_Eval(interp, kSetup) != TCL_OK) {
        std::fprintf(stderr, "kelmarsh: %s\n", Tcl_GetStringResult(interp));
        Tcl_Exit(1);
    }
    if (g_project != nullptr) {
        Tcl_Obj* command[] = {Tcl_NewStringObj("::kelmartool::open", -1), Tcl_NewStringObj(g_project, -1)};
        Tcl_Obj* line = Tcl_NewListObj(2, command);
        Tcl_IncrRefCount(line);
        const int code = Tcl_EvalObjEx(interp, line, 0);
        Tcl_DecrRefCount(line);
        if (code != TCL_OK) {
            std::fprintf(stderr, "kelmarsh: %s\n", Tcl_GetStringResult(interp));
            Tcl_Exit(1);
        }
        Tcl_ResetResult(interp);
    }
    RunScript(interp);
    return TCL_OK;
}

}  // namespace

int main(int argc, char** argv) {
    std::vector<char*> args{argv[0]};
    int i = 1;
    if (i < argc && std::strcmp(argv[i], "-project") == 0) {
        if (i + 1 >= argc) {
            std::fprintf(stderr, "usage: kelmarsh ?-project FILE? ?script.tcl? ?arg ...?\n");
            return 2;
        }
        g_project = argv[i + 1];
        i += 2;
    }
    for (; i < argc; ++i) args.push_back(argv[i]);
    args.push_back(nullptr);
    Tcl_Main(static_cast<int>(args.size()) - 1, args.data(), AppInit);
    return 0;
}
