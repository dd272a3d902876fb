// What a loadable module that uses the portability layer holds for as long as it is loaded: one
// init object of each kind, in this order, so that the layer (strings, the component factory and
// its tables) stays up until the last module that uses it is unloaded. Define one per module, in
// the file of its Tcl entry:
//
//     namespace { TcltaskKit::ModuleInit s_portLayer; }
#pragma once

#include "Port/Init.h"

namespace TcltaskKit {

struct ModuleInit {
    Port::FileInit file;
    Port::PathListInit pathList;
    CitP::InstanceTableInit instanceTable;
    CitP::FactoryInit factory;
};

}  // namespace TcltaskKit
