#include "shell/command_line.h"

#include <string_view>

namespace kelmarsh {

namespace {

CommandLine Refused(std::string why) {
    CommandLine line;
    line.action = CommandLine::Action::Error;
    line.error = std::move(why);
    return line;
}

constexpr const char kSynopsis[] =
    "usage: kelmarsh ?-project FILE? ?-netlist FILE? ?-norc? ?-gui? ?--? ?script.tcl? ?arg ...?\n"
    "       kelmarsh -h | --help | --version\n";

constexpr const char kDetails[] =
    "  -project FILE  open the design FILE as the current project first\n"
    "  -netlist FILE  import the synthesized JSON netlist FILE first (kelmartool::read_netlist),\n"
    "                 into the project file of -project when given\n"
    "  -norc          do not read ~/.kelmarshrc at the interactive prompt\n"
    "  -gui           load Tk and open the view's window (kelmartool::show); commands are read\n"
    "                 from the input between the window's events, without line editing\n"
    "  --             the next word is the script, even if it begins with -\n"
    "  -h, --help     print this text and exit\n"
    "  --version      print the version and exit\n"
    "Without a script, kelmarsh reads commands from its input; at a terminal with line editing,\n"
    "history in ~/.kelmarsh_history and completion by Tab. Type help for the tool's commands.\n";

}  // namespace

const char* Synopsis() { return kSynopsis; }

std::string UsageText() { return std::string(kSynopsis) + kDetails; }

CommandLine ParseCommandLine(int argc, const char* const argv[]) {
    CommandLine line;
    int i = 1;
    for (; i < argc; ++i) {
        const std::string_view word = argv[i];
        if (word == "-h" || word == "--help") {
            line.action = CommandLine::Action::Help;
            return line;
        }
        if (word == "--version") {
            line.action = CommandLine::Action::Version;
            return line;
        }
        if (word == "-project") {
            if (i + 1 >= argc) return Refused("-project needs a design file");
            if (!line.project.empty()) return Refused("-project given twice");
            line.project = argv[++i];
            if (line.project.empty()) return Refused("-project needs a design file");
        } else if (word == "-netlist") {
            if (i + 1 >= argc) return Refused("-netlist needs a netlist file");
            if (!line.netlist.empty()) return Refused("-netlist given twice");
            line.netlist = argv[++i];
            if (line.netlist.empty()) return Refused("-netlist needs a netlist file");
        } else if (word == "-gui") {
            line.gui = true;
        } else if (word == "-norc") {
            line.readStartupFile = false;
        } else if (word == "--") {
            ++i;
            break;
        } else if (word.starts_with('-') && word.size() > 1) {
            return Refused("unknown option \"" + std::string(word) + "\"");
        } else {
            break;
        }
    }
    if (i < argc) {
        line.hasScript = true;
        line.script = argv[i++];
        for (; i < argc; ++i) line.scriptArgs.emplace_back(argv[i]);
    }
    return line;
}

}  // namespace kelmarsh
