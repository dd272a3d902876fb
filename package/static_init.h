// Every source module of the package holds the portability layer up while it is loaded: four static
// init objects per module, constructed in this order and destroyed in the reverse order at exit.
#pragma once

#include "Port/Init.h"

namespace {
const Port::FileInit kelmarFileInit;
const Port::PathListInit kelmarPathListInit;
const CitP::InstanceTableInit kelmarInstanceTableInit;
const CitP::FactoryInit kelmarFactoryInit;
}  // namespace
