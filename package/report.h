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

// The kinds of failure a script tells apart by the error code, without reading the text. The code is
// the list {KELMAR <kind> <interface> <command word> ...}: the interface as its NAME (ICollection),
// since the package knows the class it wraps, not the word a tool publishes it under.
enum class Failure {
    Count,      // COUNT: the wrong number of words
    Word,       // WORD: no command of that word; the third word is the word typed
    Option,     // OPTION <why> <option>: an option word the command cannot take
    Default,    // DEFAULT <option>: an option's default could not be set or read
    Value,      // VALUE ?<option>?: a word could not be read as the type the command takes
    Object,     // OBJECT: the wrapper holds no object
    Loader,     // LOADER: a component library or component the call needs failed
    Operation,  // OPERATION: the operation gave failure, unless it set an error code of its own
    Exception,  // EXCEPTION: the operation threw
    Store,      // STORE: the answer or an out variable could not be handed to Tcl
};

// Why an option word is refused: the fifth word of an OPTION code.
inline constexpr const char* kOptionUnknown = "UNKNOWN";
inline constexpr const char* kOptionAmbiguous = "AMBIGUOUS";
inline constexpr const char* kOptionNoValue = "NOVALUE";
inline constexpr const char* kOptionNotSwitch = "NOTSWITCH";

// Sets the error code of a failure already reported (a report resets the code) and gives 1. Called
// on failure paths only: a call that succeeds builds no code.
int SetFailureCode(Tcl_Interp* interp, Failure kind, const char* interfaceName, const char* word,
                   const char* more = nullptr, const char* further = nullptr);

// The report of an operation that gave failure: its message as the error, and the error code the
// operation set on the interpreter if it set one (a tool's kind of refusal, or the code of a script
// the operation ran), else {KELMAR OPERATION <interface> <word>}. Gives 1.
int ReportOperationFailure(Tcl_Interp* interp, const Port_String& message, const char* interfaceName,
                           const char* word);

// Appends "\n" and the usage text of `word` when the object offers ICommandHelp.
void AppendHelp(Port_String& text, CitI::IInterface* object, const char* word);

// The error report of a failure that carries the help text: the result is reset before the help is
// asked for, as the help may run code of its own.
int ErrorReportWithHelp(Tcl_Interp* interp, Port_String text, CitI::IInterface* object, const char* word);

// "<text><className>::kel_<word>": the texts that name the class and method.
Port_String MethodText(const char* text, const char* className, const char* word);

// The failures every frame shares, each reported with its text and its code. Give 1.
int ReportNoObject(Tcl_Interp* interp, const char* className, const char* interfaceName, const char* word);
int ReportException(Tcl_Interp* interp, const char* className, const char* interfaceName, const char* word);

inline constexpr const char* kNoObjectText = "Failed to get pointer to wrapped object in ";
inline constexpr const char* kExceptionText = "An exception took place while calling ";
inline constexpr const char* kWrongCountText = "Wrong number of required arguments specified.";

}  // namespace TcltaskI
