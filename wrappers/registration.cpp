#include "wrappers/registration.h"

#include "Script/TTclWrapFactory.h"
#include "Script/TclWrapFactory.h"
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {

namespace {

template <class W>
void Register() {
    using I = typename W::Interface;
    auto* factory = new Script::TTclWrapFactory<W, I>();
    auto* face = static_cast<CitI::ITclWrapFactory*>(factory->GetInterface(CitI::ITclWrapFactoryID));
    Script::TclWrapFactory::RegisterFactory(I::IID, face);
}

}  // namespace

void RegisterWrapperFactories() {
    Register<TclWrapITclProject>();
    Register<TclWrapICollection>();
    Register<TclWrapIGlobal>();
    Register<TclWrapIGraphicalView>();
    Register<TclWrapIHighlight>();
    Register<TclWrapIObject>();
    Register<TclWrapISearch>();
    Register<TclWrapISelection>();
    Register<TclWrapITclProjectMgr>();
    Register<TclWrapITimingAnalysis>();
    Register<TclWrapIXFloorplan>();
}

}  // namespace TcltaskI
