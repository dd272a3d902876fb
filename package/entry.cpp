// The package entry and the table of identifier variables.
#include "Script/KelmarPkg.h"
#include "Script/TclWrapSupport.h"
#include "UtilI/TclPropertyLibrary.h"
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

// Sets the tables of Tcl functions of the package and of the libraries it calls Tcl through (they
// reach the Tcl that loads them through its stub table, whatever Tcl that is), brings up the
// scripting support, requests the component libraries, registers the eleven wrapper factories,
// publishes the identifiers and provides the package, so that a plain `load` leaves it present.
// Fails only on a Tcl other than 8.6: a component library that cannot be loaded now fails the first
// matched call with the loader failure, and a switch method's default with the default failure.
extern "C" __attribute__((visibility("default"))) int Tcltaski_morvane_Init(Tcl_Interp* interp) {
    if (Tcl_InitStubs(interp, "8.6", 0) == nullptr || Kelmarpkg_Init(interp) != TCL_OK ||
        Tcltask_support_Init(interp) != TCL_OK)
        return TCL_ERROR;
    // Switch methods never request them; without them their property defaults could not be made.
    TcltaskI::RequestComponentLibraries();
    TcltaskI::RegisterWrapperFactories();
    Script::TclWrapSupport::CreateVariables(interp, identifierTable);
    return Tcl_PkgProvide(interp, "TcltaskI_Morvane", KELMAR_VERSION);
}
