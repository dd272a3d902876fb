// The Fetch of one value by its storage type, shared by the frames: strings, bools, 32-bit
// integers and identifiers through the scripting support, properties through the property bridge,
// and a list element fetched like a property and appended.
#pragma once

#include <tcl.h>

#include <cstdint>
#include <utility>

#include "Script/TclWrapSupport.h"
#include "marshal/fetch_store.h"

namespace TcltaskI {

inline int FetchValue(Port_String& value, Tcl_Interp* interp, Script::Handle* word, int direction) {
    return Script::TclWrapSupport::FetchString(value, interp, word, direction);
}
inline int FetchValue(bool& value, Tcl_Interp* interp, Script::Handle* word, int direction) {
    return Script::TclWrapSupport::FetchBool(value, interp, word, direction);
}
inline int FetchValue(int32_t& value, Tcl_Interp* interp, Script::Handle* word, int direction) {
    return Script::TclWrapSupport::FetchInt32(value, interp, word, direction);
}
inline int FetchValue(UtilI::MITclProperty& value, Tcl_Interp* interp, Script::Handle* word, int direction) {
    return Fetch_InterfaceType<UtilI::ITclProperty>(value, interp, word, direction);
}
// A list element: fetched like a property and appended.
inline int FetchValue(UtilI::TclPropertyList& list, Tcl_Interp* interp, Script::Handle* word, int direction) {
    UtilI::MITclProperty element;
    if (FetchValue(element, interp, word, direction) != 0) return 1;
    list.push_back(std::move(element));
    return 0;
}
inline int FetchValue(Port::XUID& value, Tcl_Interp* interp, Script::Handle* word, int direction) {
    return Script::TclWrapSupport::FetchGuid(value, interp, word, direction);
}

}  // namespace TcltaskI
