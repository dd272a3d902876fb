// The implementer's kit: everything an implementation of a task interface needs besides the
// interface's own header. docs/implementing.md walks through it; examples/map_collection/ uses it.
//
//   Values.h     texts, numbers, lists and dicts for answers
//   Property.h   answering with a property, failing with a text, reading property arguments
//   Component.h  the counted base of an interface object
//   Help.h       usage texts of the command words (ICommandHelp)
//   Publish.h    handing an object to Tcl as an object command
//   Module.h     holding the portability layer up while a module is loaded
//
// Header-only. A module that uses it links libKelmarPkg, libPortBase and Tcl; the package and
// libTcltask_Support are loaded at run time.
#pragma once

#include "TcltaskKit/Component.h"
#include "TcltaskKit/Help.h"
#include "TcltaskKit/Module.h"
#include "TcltaskKit/Property.h"
#include "TcltaskKit/Publish.h"
#include "TcltaskKit/Values.h"
