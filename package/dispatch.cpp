#include "package/wrapper.h"

namespace TcltaskI {

int ReportUnknownWord(Tcl_Interp* interp, const char* word, const char* className, const Port_String& listing) {
    Tcl_ResetResult(interp);
    Port_String text("Unknown command ", word, " for ", className, "\n  Valid commands for this object are:\n");
    text += listing;
    return ReportWithoutReset(interp, text);
}

int ReportTooFew(Tcl_Interp* interp, CountMessage form, const char* signature, Script::Handle* const* argv) {
    if (form == CountMessage::Signature)
        return ReportWithoutReset(interp, Port_String("Wrong number of arguments for ", signature));
    Port_String object(argv[0]->GetString());
    object.Replace("::kelmar::", "", Port::CompareExact);
    const char* word = argv[1]->GetString();
    return ReportWithoutReset(interp, Port_String::doFormat("Wrong number of arguments: '%s %s'\nPlease type 'help %s %s' to get more information",
                                                            object.c_str(), word, object.c_str(), word));
}

}  // namespace TcltaskI
