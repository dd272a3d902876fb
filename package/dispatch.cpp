#include "package/wrapper.h"

namespace TcltaskI {

int ReportUnknownWord(Tcl_Interp* interp, const char* word, const char* className, const char* interfaceName,
                      const Port_String& listing, const char* typed) {
    Tcl_ResetResult(interp);
    Port_String text("Unknown command ", word, " for ", className, "\n  Valid commands for this object are:\n");
    text += listing;
    ReportWithoutReset(interp, text);
    return SetFailureCode(interp, Failure::Word, interfaceName, typed);
}

int ReportTooFew(Tcl_Interp* interp, CountMessage form, const char* signature, Script::Handle* const* argv,
                 const char* interfaceName, const char* word) {
    if (form == CountMessage::Signature) {
        ReportWithoutReset(interp, Port_String("Wrong number of arguments for ", signature));
        return SetFailureCode(interp, Failure::Count, interfaceName, word);
    }
    Port_String object(argv[0]->GetString());
    object.Replace("::kelmar::", "", Port::CompareExact);
    const char* typed = argv[1]->GetString();
    ReportWithoutReset(interp, Port_String::doFormat("Wrong number of arguments: '%s %s'\nPlease type 'help %s %s' to get more information",
                                                     object.c_str(), typed, object.c_str(), typed));
    return SetFailureCode(interp, Failure::Count, interfaceName, word);
}

}  // namespace TcltaskI
