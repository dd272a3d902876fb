// Script::TclWrapSupport: fetches and stores of plain values by direction, the identifier variables
// and the resolver behind the GetInterface command.
//
// Every Fetch and Store takes (value, interpreter, handle, direction) and gives 0 on success; on
// failure its message is in the interpreter already. IN reads the handle's word, INOUT the variable
// the word names; OUT writes the variable the handle names, RESULT (null handle) the result.
#pragma once

#include <tcl.h>

#include <cstdint>

#include "CitI/IInterface.h"
#include "Port/StringBase.h"
#include "Script/Handle.h"

namespace Script {

// One row of the identifier variable table; a row with an empty variable name ends the table.
struct TclWrapIDEntry {
    Port::StringBase<char> namespaceName;
    Port::StringBase<char> variableName;
    Port::XUIDFunction identifierFunction;
};

class TclWrapSupport {
public:
    static int FetchString(Port::StringBase<char>& value, Tcl_Interp* interp, Handle* handle, int direction);
    static int FetchBool(bool& value, Tcl_Interp* interp, Handle* handle, int direction);
    static int FetchInt32(int32_t& value, Tcl_Interp* interp, Handle* handle, int direction);
    // The word as an identifier; a word that is none gives the all-zero identifier. Always 0.
    static int FetchGuid(Port::XUID& value, Tcl_Interp* interp, Handle* handle, int direction);

    static int StoreString(const Port::StringBase<char>& value, Tcl_Interp* interp, Handle* handle, int direction);
    static int StoreInt64(int64_t value, Tcl_Interp* interp, Handle* handle, int direction);

    // Makes namespaceName::variableName hold the text form of the identifier, for every row up to
    // the terminator. 0 when all were made.
    static int CreateVariables(Tcl_Interp* interp, TclWrapIDEntry* table);

    // Wraps `object` by the factory of `id` and makes the wrapper's word the result; a null object
    // gives the integer 0. Gives the Tcl code.
    static int TclWrapResolver(Port::XUID id, CitI::IInterface* object, Tcl_Interp* interp);
};

}  // namespace Script
