// The default of an option of a matched or a switch method. Each call sets the option's variable
// anew, exactly as the line "namespace eval <class>::<word> {variable <var>; set <var> <default>}"
// would, run from the namespace the caller is in, and takes the option's value from the variable.
#pragma once

#include <tcl.h>

#include <vector>

#include "Script/TclObjRef.h"
#include "marshal/declare.h"

namespace TcltaskI {

// What one option's default needs, made once per thread and kept for the thread's life: its values
// hold a reference each and are never given back, since Tcl may have ended the thread's values by
// the time a thread-local destructor would run. <var> is the option's name in two underscores
// either side in a matched method and bare in a switch method.
struct DefaultLine {
    Tcl_Obj* space = nullptr;     // "<class>::<word>", relative to the current namespace
    Tcl_Obj* name = nullptr;      // "<var>"
    Tcl_Obj* variable = nullptr;  // "<class>::<word>::<var>", how the caller reads the variable back
    Tcl_Obj* line = nullptr;      // the whole line, run as it is for a default of any other form
    Tcl_Obj* literal = nullptr;   // the value of a default that is one literal word
    std::vector<Tcl_Obj*> command;  // the words of a default that is one command of literal words
    // The words "namespace eval <space> <body>" that the namespace's frame shows as its own.
    Tcl_Obj* frameWords[4] = {};
};

void MakeDefaultLine(DefaultLine& out, const char* className, const char* word, const Option& option, bool matched);

// Sets the option's variable as the line would. Gives the Tcl code; on TCL_OK `value` holds the
// variable's value when nothing can see a read of it (no trace), and is empty when the caller must
// read the variable back by `line.variable`, as the line's own caller would.
int SetDefault(Tcl_Interp* interp, const DefaultLine& line, Script::TclObjRef& value);

}  // namespace TcltaskI
