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

Port_String MethodText(const char* text, const char* className, const char* word) {
    return Port_String(text, className, "::kel_", word);
}

}  // namespace TcltaskI
