// How an input argument of an operation appears in a recorded call. One overload per argument type
// of the task interfaces; each appends one element to the call's list.
#pragma once

#include <tcl.h>

#include <cstdint>

#include "Dpm/IProjectHelper.h"
#include "UtilI/ITclProperty.h"

namespace TestKit {

void Render(Tcl_Obj* call, const Port_String& text);
void Render(Tcl_Obj* call, bool flag);
void Render(Tcl_Obj* call, int32_t number);
void Render(Tcl_Obj* call, const UtilI::MITclProperty& property);
void Render(Tcl_Obj* call, const UtilI::TclPropertyList& properties);
void Render(Tcl_Obj* call, const Port::XUID& id);
void Render(Tcl_Obj* call, Dpm::IProjectHelper* helper);
void Render(Tcl_Obj* call, const CitI::MIInterface& component);

}  // namespace TestKit
