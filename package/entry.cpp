// The package entry and the table of identifier variables.
#include "Script/KelmarPkg.h"
#include "Script/TclWrapSupport.h"
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

// Brings up the scripting support, registers the eleven wrapper factories and publishes the
// identifiers. Checks nothing and always gives TCL_OK.
extern "C" __attribute__((visibility("default"))) int Tcltaski_morvane_Init(Tcl_Interp* interp) {
    Kelmarpkg_Init(interp);
    TcltaskI::RegisterWrapperFactories();
    Script::TclWrapSupport::CreateVariables(interp, identifierTable);
    return TCL_OK;
}
