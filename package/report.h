// The two ways the package tells Tcl of a failure, and the help text some failures carry.
#pragma once

#include <tcl.h>

#include "CitI/IInterface.h"
#include "Port/StringBase.h"

namespace TcltaskI {

// The error report: reset the result, then the text as result and into errorInfo. Gives 1.
int ErrorReport(Tcl_Interp* interp, const Port_String& text);
// The same without resetting the result first. Gives 1.
int ReportWithoutReset(Tcl_Interp* interp, const Port_String& text);

// Appends "\n" and the usage text of `word` when the object offers ICommandHelp.
void AppendHelp(Port_String& text, CitI::IInterface* object, const char* word);

// The error report of a failure that carries the help text: the result is reset before the help is
// asked for, as the help may run code of its own.
int ErrorReportWithHelp(Tcl_Interp* interp, Port_String text, CitI::IInterface* object, const char* word);

// "<text><className>::kel_<word>": the texts that name the class and method.
Port_String MethodText(const char* text, const char* className, const char* word);

inline constexpr const char* kNoObjectText = "Failed to get pointer to wrapped object in ";
inline constexpr const char* kExceptionText = "An exception took place while calling ";
inline constexpr const char* kWrongCountText = "Wrong number of required arguments specified.";

}  // namespace TcltaskI
