// The package entry and the table of identifier variables.
#include "Script/KelmarPkg.h"
#include "Script/TclWrapSupport.h"
#include "marshal/options.h"
#include "package/static_init.h"
#include "wrappers/registration.h"

namespace {

using Port::BuildXUID;

// The variables ::kelmar::TcltaskI::<Interface>ID, one per task interface; the last row ends the table.
Script::TclWrapIDEntry identifierTable[] = {
    {"::kelmar::TcltaskI", "ITclProjectID", &BuildXUID<TcltaskI::ITclProjectID>},
    {"::kelmar::TcltaskI", "ICollectionID", &BuildXUID<TcltaskI::ICollectionID>},
    {"::kelmar::TcltaskI", "IGlobalID", &BuildXUID<TcltaskI::IGlobalID>},
    {"::kelmar::TcltaskI", "IGraphicalViewID", &BuildXUID<TcltaskI::IGraphicalViewID>},
    {"::kelmar::TcltaskI", "IHighlightID", &BuildXUID<TcltaskI::IHighlightID>},
    {"::kelmar::TcltaskI", "IObjectID", &BuildXUID<TcltaskI::IObjectID>},
    {"::kelmar::TcltaskI", "ISearchID", &BuildXUID<TcltaskI::ISearchID>},
    {"::kelmar::TcltaskI", "ISelectionID", &BuildXUID<TcltaskI::ISelectionID>},
    {"::kelmar::TcltaskI", "ITclProjectMgrID", &BuildXUID<TcltaskI::ITclProjectMgrID>},
    {"::kelmar::TcltaskI", "ITimingAnalysisID", &BuildXUID<TcltaskI::ITimingAnalysisID>},
    {"::kelmar::TcltaskI", "IXFloorplanID", &BuildXUID<TcltaskI::IXFloorplanID>},
    {"", "", nullptr},
};

}  // namespace

// Brings up the scripting support, requests the component libraries, registers the eleven wrapper
// factories and publishes the identifiers. Checks nothing and always gives TCL_OK: a library that
// cannot be loaded now fails the first matched call with the loader failure, and a switch method's
// default with the default failure.
extern "C" __attribute__((visibility("default"))) int Tcltaski_morvane_Init(Tcl_Interp* interp) {
    Kelmarpkg_Init(interp);
    // Switch methods never request them; without them their property defaults could not be made.
    TcltaskI::RequestComponentLibraries();
    TcltaskI::RegisterWrapperFactories();
    Script::TclWrapSupport::CreateVariables(interp, identifierTable);
    return TCL_OK;
}
