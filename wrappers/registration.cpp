#include "wrappers/registration.h"

#include "Script/TTclWrapFactory.h"
#include "Script/TclWrapFactory.h"
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {

namespace {

// One factory per class for the process: it has no data, so every load of the package, in any
// interpreter or thread, registers the same object again instead of a new one each time.
template <class W>
void Register() {
    using I = typename W::Interface;
    static auto* const factory = new Script::TTclWrapFactory<W, I>();
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
