// The command line of kelmarsh:
//
//   kelmarsh ?-project FILE? ?-netlist FILE? ?-norc? ?-gui? ?--? ?script.tcl? ?arg ...?
//   kelmarsh -h | --help | --version
//
// The options may stand in any order before the script; the first word that is not an option is the
// script, and every word after it goes to the script as $argv.
#pragma once

#include <string>
#include <vector>

namespace kelmarsh {

struct CommandLine {
    enum class Action { Run, Help, Version, Error };
    Action action = Action::Run;
    std::string error;                 // why the line was refused, for Action::Error
    std::string project;               // empty: no project opened at start
    std::string netlist;               // imported at start, into `project` when that is given
    bool readStartupFile = true;       // -norc turns ~/.kelmarshrc off
    bool gui = false;                  // -gui: Tk and the view's window
    bool hasScript = false;
    std::string script;
    std::vector<std::string> scriptArgs;
};

CommandLine ParseCommandLine(int argc, const char* const argv[]);

// The usage text printed by -h; its synopsis alone after a refused command line.
std::string UsageText();
const char* Synopsis();

}  // namespace kelmarsh
