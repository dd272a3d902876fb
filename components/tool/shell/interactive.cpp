#include "shell/interactive.h"

#include <pwd.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdlib>
#include <optional>

#include "shell/error_trace.h"
#include "shell/interrupt.h"
#include "shell/line_reader.h"

namespace kelmarsh {

namespace {

constexpr const char* kPrompt = "kelmarsh% ";
constexpr const char* kContinuationPrompt = "> ";

// Writes a line to Tcl's own standard channel, where the script's output goes too, so that the
// two keep their order. A script may have closed the channel: then there is nowhere to say it.
void WriteLine(int which, const std::string& text) {
    Tcl_Channel channel = Tcl_GetStdChannel(which);
    if (channel == nullptr) return;
    Tcl_WriteChars(channel, text.data(), static_cast<int>(text.size()));
    Tcl_WriteChars(channel, "\n", 1);
    Tcl_Flush(channel);
}

void FlushOutput() {
    for (int which : {TCL_STDOUT, TCL_STDERR})
        if (Tcl_Channel channel = Tcl_GetStdChannel(which)) Tcl_Flush(channel);
}

void RunStartupFile(Tcl_Interp* interp, const std::string& path, InterruptWatcher& watcher) {
    struct stat status;
    if (path.empty() || stat(path.c_str(), &status) != 0) return;
    Tcl_Obj* file = Tcl_NewStringObj(path.c_str(), -1);
    Tcl_IncrRefCount(file);
    watcher.BeginCommand();
    const int code = Tcl_FSEvalFileEx(interp, file, nullptr);
    const bool interrupted = watcher.EndCommand();
    Tcl_DecrRefCount(file);
    if (code == TCL_ERROR)
        WriteLine(TCL_STDERR, "kelmarsh: error in " + path + ": " + (interrupted ? "interrupted" : ErrorTrace(interp)));
    Tcl_ResetResult(interp);
}

// One whole command, recorded in Tcl's own history as tclsh does; its result or its error shown.
void RunCommand(Tcl_Interp* interp, const std::string& command, InterruptWatcher& watcher) {
    Tcl_Obj* script = Tcl_NewStringObj(command.data(), static_cast<int>(command.size()));
    Tcl_IncrRefCount(script);
    watcher.BeginCommand();
    const int code = Tcl_RecordAndEvalObj(interp, script, TCL_EVAL_GLOBAL);
    const bool interrupted = watcher.EndCommand();
    Tcl_DecrRefCount(script);
    const std::string result = Tcl_GetStringResult(interp);
    if (code == TCL_ERROR)
        WriteLine(TCL_STDERR, interrupted ? "interrupted" : result);
    else if (!result.empty())
        WriteLine(TCL_STDOUT, result);
    Tcl_ResetResult(interp);
}

}  // namespace

std::string HomeDirectory() {
    if (const char* home = std::getenv("HOME"); home != nullptr && *home != '\0') return home;
    if (const passwd* account = getpwuid(getuid()); account != nullptr && account->pw_dir != nullptr) return account->pw_dir;
    return "";
}

int RunInteractive(Tcl_Interp* interp, const InteractiveSettings& settings) {
    const std::string home = HomeDirectory();
    InterruptWatcher watcher(interp);
    if (!settings.banner.empty()) WriteLine(TCL_STDOUT, settings.banner);
    if (settings.readStartupFile && !home.empty()) RunStartupFile(interp, home + "/.kelmarshrc", watcher);

    LineReader reader(interp, home.empty() ? "" : home + "/.kelmarsh_history", watcher.PromptFd());
    std::string pending;  // the lines of a command that is not complete yet
    for (;;) {
        FlushOutput();
        watcher.TakeInterrupt();
        const std::optional<std::string> line = reader.Read(pending.empty() ? kPrompt : kContinuationPrompt, pending);
        if (watcher.TakeInterrupt()) {
            // Ctrl-C at the prompt drops what was typed of the command, as in other shells.
            pending.clear();
            WriteLine(TCL_STDOUT, "^C");
            continue;
        }
        if (!line) {
            WriteLine(TCL_STDOUT, "");
            break;
        }
        pending += *line;
        pending += '\n';
        if (!Tcl_CommandComplete(pending.c_str())) continue;
        pending.pop_back();
        reader.Remember(pending);
        RunCommand(interp, pending, watcher);
        pending.clear();
    }
    return 0;
}

}  // namespace kelmarsh
