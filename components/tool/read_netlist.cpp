// kelmartool::read_netlist NETLIST.json ?-top MODULE? ?-clock NET=PERIOD ...? ?-device COLSxROWS?
// ?-utilization U? ?-seed N? ?-library FILE? ?-project FILE?: imports a synthesized netlist
// (netlist/netlist.h) with the delays of a delay library (netlist/delay_library.h), places it,
// writes it as a design file (by default beside the netlist, NAME.design.json) and opens that as
// the current project. Nothing is written or opened unless the whole import succeeds.
#include <tcl.h>

#include <cerrno>
#include <cstdlib>
#include <exception>
#include <string>

#include "TcltaskI/ITclProjectMgr.h"
#include "file_io.h"
#include "netlist/netlist.h"
#include "project.h"
#include "roots.h"

namespace kelmartool {

namespace {

constexpr const char* kUsage =
    "netlist ?-top module? ?-clock net=period ...? ?-device colsxrows? ?-utilization u? ?-seed n? ?-library file? "
    "?-project file?";

// "8x6": columns and rows.
bool ParseDevice(const std::string& text, int& columns, int& rows) {
    const std::size_t x = text.find('x');
    if (x == std::string::npos || x == 0 || x + 1 == text.size()) return false;
    const auto number = [](const std::string& digits, int& out) {
        if (digits.size() > 6 || digits.find_first_not_of("0123456789") != std::string::npos) return false;
        out = std::atoi(digits.c_str());
        return true;
    };
    return number(text.substr(0, x), columns) && number(text.substr(x + 1), rows);
}

int Fail(Tcl_Interp* interp, const ToolState& state, Refusal kind, std::initializer_list<std::string_view> more,
         const std::string& text) {
    SetRefusal(state, kind, more);
    Tcl_SetObjResult(interp, Tcl_NewStringObj(text.c_str(), static_cast<int>(text.size())));
    return TCL_ERROR;
}

int ReadNetlist(Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc < 2 || objc % 2 != 0) {
        Tcl_WrongNumArgs(interp, 1, objv, kUsage);
        return TCL_ERROR;
    }
    StatePtr state = StateOf(interp);
    if (!state) {
        Tcl_SetObjResult(interp, Tcl_NewStringObj(kStateGone, -1));
        return TCL_ERROR;
    }
    const std::string file = Tcl_GetString(objv[1]);
    NetlistOptions options;
    std::string project, library = DefaultDelayLibraryFile();
    bool utilization = false;
    static const char* const kOptions[] = {"-top",    "-clock",   "-device",      "-seed",
                                           "-project", "-library", "-utilization", nullptr};
    for (int i = 2; i < objc; i += 2) {
        int which = 0;
        if (Tcl_GetIndexFromObj(interp, objv[i], kOptions, "option", 0, &which) != TCL_OK) {
            SetRefusal(*state, Refusal::Value);
            return TCL_ERROR;
        }
        const std::string value = Tcl_GetString(objv[i + 1]);
        switch (which) {
            case 0: options.top = value; break;
            case 1: {
                const std::size_t eq = value.rfind('=');
                double period = 0;
                Tcl_Obj* number = Tcl_NewStringObj(value.c_str() + (eq == std::string::npos ? 0 : eq + 1), -1);
                Tcl_IncrRefCount(number);
                const bool ok = eq != std::string::npos && eq > 0 &&
                                Tcl_GetDoubleFromObj(nullptr, number, &period) == TCL_OK && period > 0 &&
                                period <= kMaxTime;
                Tcl_DecrRefCount(number);
                if (!ok)
                    return Fail(interp, *state, Refusal::Value, {},
                                "-clock wants NET=PERIOD with a period in ns above 0, not \"" + value + "\"");
                options.clocks[value.substr(0, eq)] = period;
                break;
            }
            case 2:
                if (!ParseDevice(value, options.columns, options.rows))
                    return Fail(interp, *state, Refusal::Value, {},
                                "-device wants COLUMNSxROWS such as 12x10, not \"" + value + "\"");
                break;
            case 3: {
                Tcl_WideInt seed = 0;
                if (Tcl_GetWideIntFromObj(nullptr, objv[i + 1], &seed) != TCL_OK || seed < 0)
                    return Fail(interp, *state, Refusal::Value, {},
                                "-seed wants a whole number of at least 0, not \"" + value + "\"");
                options.seed = static_cast<std::uint64_t>(seed);
                break;
            }
            case 4: project = value; break;
            case 5: library = value; break;
            default: {
                double share = 0;
                if (Tcl_GetDoubleFromObj(nullptr, objv[i + 1], &share) != TCL_OK || !(share > 0 && share <= 1))
                    return Fail(interp, *state, Refusal::Value, {},
                                "-utilization wants a share of the logic sites above 0 and at most 1, not \"" + value +
                                    "\"");
                options.utilization = share;
                utilization = true;
                break;
            }
        }
    }
    // Both would size the device, and one would be ignored without a word.
    if (utilization && options.columns > 0)
        return Fail(interp, *state, Refusal::Value, {},
                    "-device and -utilization both size the device: give one of them");
    if (project.empty()) {
        project = file.ends_with(".json") ? file.substr(0, file.size() - 5) : file;
        project += ".design.json";
    }

    std::string text, why;
    if (!ReadTextFile(library, text, why))
        return Fail(interp, *state, Refusal::File, {library},
                    "cannot read the delay library '" + library + "': " + why);
    if (why = ReadDelayLibrary(library, text, options.library); !why.empty())
        return Fail(interp, *state, Refusal::File, {library}, why);
    if (!ReadTextFile(file, text, why))
        return Fail(interp, *state, Refusal::File, {file}, "cannot read the netlist '" + file + "': " + why);
    const std::unique_ptr<Design> design = ImportNetlist(file, text, options, why);
    if (!design) return Fail(interp, *state, Refusal::File, {file}, why);

    // A project that is open keeps its design: the import would not reach it.
    const std::string normal = NormalFile(project);
    for (const auto& open : state->projects)
        if (static_cast<ProjectComponent*>(open.get())->File() == normal)
            return Fail(interp, *state, Refusal::State, {},
                        "the project file '" + project + "' is open: close it or name another with -project");
    std::string designText;
    if (!FormatDesign(*design, designText, why) || !WriteTextFile(project, designText, why))
        return Fail(interp, *state, Refusal::File, {project}, "cannot write the project file '" + project + "': " + why);

    CommonI::RefCountPtr<TcltaskI::ITclProjectMgr> manager(
        static_cast<TcltaskI::ITclProjectMgr*>(NewProjectManager(state)->GetInterface(TcltaskI::ITclProjectMgrID)));
    Port_String message;
    if (manager->Open(project.c_str(), message) != 1)
        return Fail(interp, *state, Refusal::File, {project}, message.c_str());
    Tcl_SetObjResult(interp, Tcl_NewStringObj(normal.c_str(), static_cast<int>(normal.size())));
    return TCL_OK;
}

}  // namespace

int ReadNetlistCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    // Called by Tcl directly: nothing may be thrown past here.
    try {
        return ReadNetlist(interp, objc, objv);
    } catch (const std::exception& e) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("cannot import the netlist: %s", e.what()));
        return TCL_ERROR;
    }
}

}  // namespace kelmartool
