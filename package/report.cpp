#include "package/report.h"

#include "ICommandHelp.h"

namespace TcltaskI {

int ReportWithoutReset(Tcl_Interp* interp, const Port_String& text) {
    Tcl_SetObjResult(interp, Tcl_NewStringObj(text.c_str(), -1));
    Tcl_AddObjErrorInfo(interp, text.c_str(), text.Length());
    return 1;
}

int ErrorReport(Tcl_Interp* interp, const Port_String& text) {
    Tcl_ResetResult(interp);
    return ReportWithoutReset(interp, text);
}

void AppendHelp(Port_String& text, CitI::IInterface* object, const char* word) {
    CommonI::RefCountPtr<ICommandHelp> help(static_cast<ICommandHelp*>(object->GetInterface(ICommandHelpID)));
    if (!help) return;
    text += "\n";
    text += help->GetHelp(Port_String(word));
}

int ErrorReportWithHelp(Tcl_Interp* interp, Port_String text, CitI::IInterface* object, const char* word) {
    Tcl_ResetResult(interp);
    AppendHelp(text, object, word);
    return ReportWithoutReset(interp, text);
}

namespace {

const char* KindWord(Failure kind) {
    switch (kind) {
        case Failure::Count: return "COUNT";
        case Failure::Word: return "WORD";
        case Failure::Option: return "OPTION";
        case Failure::Default: return "DEFAULT";
        case Failure::Value: return "VALUE";
        case Failure::Object: return "OBJECT";
        case Failure::Loader: return "LOADER";
        case Failure::Operation: return "OPERATION";
        case Failure::Exception: return "EXCEPTION";
        case Failure::Store: return "STORE";
    }
    return "UNKNOWN";
}

// The error code the interpreter holds now, with a reference, or null when none is set. Asked with
// TCL_OK, Tcl hands over the options as they are, without starting an errorInfo of its own.
Tcl_Obj* HeldErrorCode(Tcl_Interp* interp) {
    Tcl_Obj* options = Tcl_GetReturnOptions(interp, TCL_OK);
    Tcl_IncrRefCount(options);
    Tcl_Obj* key = Tcl_NewStringObj("-errorcode", -1);
    Tcl_IncrRefCount(key);
    Tcl_Obj* code = nullptr;
    if (Tcl_DictObjGet(nullptr, options, key, &code) != TCL_OK) code = nullptr;
    if (code != nullptr) Tcl_IncrRefCount(code);
    Tcl_DecrRefCount(key);
    Tcl_DecrRefCount(options);
    return code;
}

}  // namespace

int SetFailureCode(Tcl_Interp* interp, Failure kind, const char* interfaceName, const char* word, const char* more,
                   const char* further) {
    // Tcl_SetErrorCode stops at the first null: `further` counts only behind `more`.
    Tcl_SetErrorCode(interp, "KELMAR", KindWord(kind), interfaceName, word != nullptr ? word : "", more, further,
                     static_cast<const char*>(nullptr));
    return 1;
}

int ReportOperationFailure(Tcl_Interp* interp, const Port_String& message, const char* interfaceName,
                           const char* word) {
    Tcl_Obj* own = HeldErrorCode(interp);
    ErrorReport(interp, message);
    if (own == nullptr) return SetFailureCode(interp, Failure::Operation, interfaceName, word);
    Tcl_SetObjErrorCode(interp, own);
    Tcl_DecrRefCount(own);
    return 1;
}

Port_String MethodText(const char* text, const char* className, const char* word) {
    return Port_String(text, className, "::kel_", word);
}

int ReportNoObject(Tcl_Interp* interp, const char* className, const char* interfaceName, const char* word) {
    ErrorReport(interp, MethodText(kNoObjectText, className, word));
    return SetFailureCode(interp, Failure::Object, interfaceName, word);
}

int ReportException(Tcl_Interp* interp, const char* className, const char* interfaceName, const char* word) {
    ErrorReport(interp, MethodText(kExceptionText, className, word));
    return SetFailureCode(interp, Failure::Exception, interfaceName, word);
}

}  // namespace TcltaskI
