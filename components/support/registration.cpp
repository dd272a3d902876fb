// Makes the property component known to the component factory: once when the library is loaded,
// and again whenever the factory calls the exported registration function.
#include <new>

#include "CitP/Factory.h"
#include "Port/Init.h"
#include "tcl_property.h"

namespace {

// The portability layer must be up before the registration below runs and stay up while the
// library is loaded.
Port::FileInit s_fileInit;
Port::PathListInit s_pathListInit;
CitP::InstanceTableInit s_instanceTableInit;
CitP::FactoryInit s_factoryInit;

CitI::IInterface* CreateTclProperty() {
    return static_cast<UtilI::ITclProperty*>(new (std::nothrow) TcltaskSupport::TclProperty);
}

void RegisterClasses() {
    CitP::Factory::RegisterClass(UtilI::TclPropertyID, &CreateTclProperty);
}

// Called directly, not through the exported name: every component library exports that same name,
// and a call through it could reach another library's function.
struct RegisterOnLoad {
    RegisterOnLoad() { RegisterClasses(); }
} s_registerOnLoad;

}  // namespace

extern "C" __attribute__((visibility("default"))) void CitP_RegisterComponents() { RegisterClasses(); }
