// The makers of the tool's interface objects that the shell hands to Tcl under the root words.
// Each gives a new object with no reference taken yet, as its root interface.
#pragma once

#include "design.h"
#include "property.h"

namespace kelmartool {

CitI::IInterface* NewCollection(const StatePtr& state);
CitI::IInterface* NewGlobal(const StatePtr& state);
CitI::IInterface* NewObjectQuery(const StatePtr& state);
CitI::IInterface* NewView(const StatePtr& state);
CitI::IInterface* NewHighlight(const StatePtr& state);
CitI::IInterface* NewSelection(const StatePtr& state);
CitI::IInterface* NewSearch(const StatePtr& state);

// kelmartool::read_netlist (read_netlist.cpp).
int ReadNetlistCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]);

// Settings tables answer alike wherever they are kept: a dict of name and value, or with
// descriptors a list of dicts with name, type, description and value.
Tcl_Obj* SettingsValue(const SettingTable& table, bool descriptors);
// Sets one setting of a table (a new one too, when `allowNew`) and answers with its canonical value.
CommonI::RESULT SetSetting(const ToolState& state, SettingTable& table, const std::string& name,
                           const std::string& text, bool allowNew, UtilI::MITclProperty& result, Port_String& message);
// Answers with the value of one setting; `what` names the setting's kind in the failure text.
CommonI::RESULT GetSetting(const ToolState& state, const SettingTable& table, const std::string& name, const char* what,
                           UtilI::MITclProperty& result, Port_String& message);

}  // namespace kelmartool
