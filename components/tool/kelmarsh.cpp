// kelmarsh: the tool's Tcl shell.
//
//   kelmarsh ?-project FILE? ?-netlist FILE? ?-norc? ?-gui? ?--? ?script.tcl? ?arg ...?
//
// Loads the tool package from the lib folder beside the shell's own binary, imports its root
// commands and makes `help`, opens FILE as the current project when given, then runs the script,
// or reads commands: at a terminal with line editing, history and completion (shell/), otherwise as
// tclsh reads them.
//
// With -gui the shell loads Tk and opens the view's window before the script or the commands. Tk
// gives Tcl_Main its event loop, so commands are read from the input by a file handler between the
// window's events (as wish reads them), without the shell's line editing, whose reader would block
// the window. A script runs first; the window then stays, with commands read, until the input ends.
#include <tcl.h>
#include <unistd.h>

#include <cstdio>
#include <string>
#include <vector>

#include "shell/command_line.h"
#include "shell/error_trace.h"
#include "shell/interactive.h"
#include "shell/package_dirs.h"

namespace {

kelmarsh::CommandLine g_commandLine;
std::string g_openMessage;  // what opening the project said, the banner of the prompt

void ReportScriptError(Tcl_Interp* interp) { std::fprintf(stderr, "%s\n", kelmarsh::ErrorTrace(interp).c_str()); }

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
    if (!g_commandLine.gui) Tcl_Exit(0);
    Tcl_SetStartupScript(nullptr, nullptr);  // Tcl_Main goes on to the event loop, not to the script again
}

// -gui: Tk, the main window withdrawn, and the view's window.
void OpenWindow(Tcl_Interp* interp) {
    if (!g_commandLine.gui) return;
    if (Tcl_Eval(interp, "::kelmartool::show; wm withdraw .") != TCL_OK) {
        std::fprintf(stderr, "kelmarsh: -gui: %s\n", Tcl_GetStringResult(interp));
        Tcl_Exit(1);
    }
    Tcl_ResetResult(interp);
}

// The packages are looked for beside the binary itself, through every symbolic link to it, ahead of
// any other folder: the shell loads the tool it was built with.
void AddPackageDirs(Tcl_Interp* interp) {
    const char* named = Tcl_GetNameOfExecutable();
    Tcl_Obj* dirs = Tcl_NewListObj(0, nullptr);
    for (const std::string& dir : kelmarsh::PackageDirs(kelmarsh::ResolvedExecutable(named ? named : "")))
        Tcl_ListObjAppendElement(nullptr, dirs, Tcl_NewStringObj(dir.c_str(), -1));
    Tcl_Obj* command[] = {Tcl_NewStringObj("apply", -1),
                          Tcl_NewStringObj("dirs {set ::auto_path [linsert $::auto_path 0 {*}$dirs]}", -1), dirs};
    Tcl_Obj* line = Tcl_NewListObj(3, command);
    Tcl_IncrRefCount(line);
    Tcl_EvalObjEx(interp, line, 0);
    Tcl_DecrRefCount(line);
    Tcl_ResetResult(interp);
}

// Opens the -project file, or imports the -netlist into it (or beside the netlist).
void OpenProject(Tcl_Interp* interp) {
    const std::string& project = g_commandLine.project;
    const std::string& netlist = g_commandLine.netlist;
    if (project.empty() && netlist.empty()) return;
    Tcl_Obj* line = Tcl_NewListObj(0, nullptr);
    const auto add = [line](const std::string& word) {
        Tcl_ListObjAppendElement(nullptr, line, Tcl_NewStringObj(word.c_str(), static_cast<int>(word.size())));
    };
    if (netlist.empty()) {
        add("::kelmartool::open"), add(project);
    } else {
        add("::kelmartool::read_netlist"), add(netlist);
        if (!project.empty()) add("-project"), add(project);
    }
    Tcl_IncrRefCount(line);
    const int code = Tcl_EvalObjEx(interp, line, 0);
    Tcl_DecrRefCount(line);
    if (code != TCL_OK) {
        std::fprintf(stderr, "kelmarsh: %s\n", Tcl_GetStringResult(interp));
        Tcl_Exit(1);
    }
    g_openMessage = Tcl_GetStringResult(interp);
    if (!netlist.empty()) g_openMessage = "imported " + netlist + " into " + g_openMessage;
    Tcl_ResetResult(interp);
}

// Without a script and with a terminal on the input, the shell's own prompt; it ends the process.
// Commands piped in are left to Tcl_Main, which reads them as tclsh does.
void RunPrompt(Tcl_Interp* interp) {
    if (g_commandLine.hasScript || g_commandLine.gui || !isatty(0)) return;
    kelmarsh::InteractiveSettings settings;
    if (!g_openMessage.empty()) settings.banner = "kelmarsh " KELMAR_VERSION ": " + g_openMessage;
    settings.readStartupFile = g_commandLine.readStartupFile;
    Tcl_Exit(kelmarsh::RunInteractive(interp, settings));
}

int AppInit(Tcl_Interp* interp) {
    if (Tcl_Init(interp) != TCL_OK) return TCL_ERROR;
    AddPackageDirs(interp);
    // The tool keeps its roots in ::kelmartool; the shell imports them one by one, so that a name
    // taken already (by a package on the path, say) costs that name alone, and says so. `help` is
    // what the package's wrong-count messages ask for.
    static const char* const kSetup =
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
    OpenProject(interp);
    OpenWindow(interp);
    RunScript(interp);
    RunPrompt(interp);
    return TCL_OK;
}

}  // namespace

int main(int argc, char** argv) {
    g_commandLine = kelmarsh::ParseCommandLine(argc, argv);
    switch (g_commandLine.action) {
        case kelmarsh::CommandLine::Action::Help:
            std::fputs(kelmarsh::UsageText().c_str(), stdout);
            return 0;
        case kelmarsh::CommandLine::Action::Version:
            std::printf("kelmarsh %s\n", KELMAR_VERSION);
            return 0;
        case kelmarsh::CommandLine::Action::Error:
            std::fprintf(stderr, "kelmarsh: %s\n%s", g_commandLine.error.c_str(), kelmarsh::Synopsis());
            return 2;
        case kelmarsh::CommandLine::Action::Run:
            break;
    }
    // The script is handed to Tcl_Main as already chosen, so that it takes every word after it as
    // the script's arguments, a word that begins with - too.
    Tcl_FindExecutable(argv[0]);
    if (g_commandLine.hasScript) Tcl_SetStartupScript(Tcl_NewStringObj(g_commandLine.script.c_str(), -1), nullptr);
    std::vector<char*> args{argv[0]};
    for (std::string& arg : g_commandLine.scriptArgs) args.push_back(arg.data());
    args.push_back(nullptr);
    Tcl_Main(static_cast<int>(args.size()) - 1, args.data(), AppInit);
    return 0;
}
