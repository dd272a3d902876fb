// The interactive prompt of kelmarsh, for a terminal on its input: the start-up file, the banner,
// then one command after another, with line editing, history, completion and Ctrl-C.
#pragma once

#include <tcl.h>

#include <string>

namespace kelmarsh {

struct InteractiveSettings {
    std::string banner;           // one line shown first, empty for none
    bool readStartupFile = true;  // ~/.kelmarshrc
};

// The user's home: $HOME, else the home of the user's account, else empty.
std::string HomeDirectory();

// Reads and runs commands until the end of the input (Ctrl-D at an empty prompt); `exit` in a command
// ends the process from inside Tcl as usual. Gives the exit status.
int RunInteractive(Tcl_Interp* interp, const InteractiveSettings& settings);

}  // namespace kelmarsh
