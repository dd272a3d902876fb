// The makers of the tool's interface objects that the shell hands to Tcl under the root words.
// Each gives a new object with no reference taken yet, as its root interface.
#pragma once

#include "design.h"

namespace kelmartool {

CitI::IInterface* NewCollection(const StatePtr& state);
CitI::IInterface* NewGlobal(const StatePtr& state);
CitI::IInterface* NewObjectQuery(const StatePtr& state);
CitI::IInterface* NewView(const StatePtr& state);
CitI::IInterface* NewHighlight(const StatePtr& state);
CitI::IInterface* NewSelection(const StatePtr& state);
CitI::IInterface* NewSearch(const StatePtr& state);

// Settings tables answer alike wherever they are kept: a dict of name and value, or with
// descriptors a list of dicts with name, type, description and value.
Tcl_Obj* SettingsValue(const SettingTable& table, bool descriptors);

}  // namespace kelmartool
