// The crossing from a property back to Tcl: the result store of every method whose operation gives
// its answer as a property.
#pragma once

#include <tcl.h>

#include "Port/StringBase.h"
#include "UtilI/ITclProperty.h"

namespace TcltaskI {

// A null property leaves an empty result; else its Tcl value. A failed conversion is no failure of
// the command: its text becomes the result and the code stays TCL_OK.
int StoreResultProperty(const UtilI::MITclProperty& result, Port_String& message, Tcl_Interp* interp);

}  // namespace TcltaskI
