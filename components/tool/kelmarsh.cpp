// kelmarsh: the tool's Tcl shell.
//
//   kelmarsh ?-project FILE? ?script.tcl? ?arg ...?
//
// Loads the tool package from the lib folder beside the shell's bin folder, opens FILE as the
// current project when given, then runs the script, or reads commands at a prompt.
#include <tcl.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

namespace {

const char* g_project = nullptr;

int AppInit(Tcl_Interp* interp) {
    if (Tcl_Init(interp) != TCL_OK) return TCL_ERROR;
    static const char* const kSetup =
        "lappend ::auto_path [file join [file dirname [file dirname [file normalize [info nameofexecutable]]]] lib]\n"
        "package require KelmarTool\n"
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
