// Makes the matcher and the name list known to the component factory: once when the library is
// loaded, and again whenever the factory calls the exported registration function.
#include <new>

#include "CitP/Factory.h"
#include "Port/Init.h"
#include "cmd_arg_matcher.h"
#include "option_name_list.h"

namespace {

// The portability layer must be up before the registration below runs and stay up while the
// library is loaded.
Port::FileInit s_fileInit;
Port::PathListInit s_pathListInit;
CitP::InstanceTableInit s_instanceTableInit;
CitP::FactoryInit s_factoryInit;

CitI::IInterface* CreateCmdArgMatcher() {
    return static_cast<ICmdArgMatcher*>(new (std::nothrow) ArgMatchKit::CmdArgMatcher);
}

CitI::IInterface* CreateOptionNameList() {
    return static_cast<IOptionNameList*>(new (std::nothrow) ArgMatchKit::OptionNameList);
}

void RegisterClasses() {
    CitP::Factory::RegisterClass(CmdArgMatcherID, &CreateCmdArgMatcher);
    CitP::Factory::RegisterClass(OptionNameListID, &CreateOptionNameList);
}

// Called directly, not through the exported name: every component library exports that same name,
// and a call through it could reach another library's function.
struct RegisterOnLoad {
    RegisterOnLoad() { RegisterClasses(); }
} s_registerOnLoad;

}  // namespace

extern "C" __attribute__((visibility("default"))) void CitP_RegisterComponents() { RegisterClasses(); }
