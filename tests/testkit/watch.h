// What the kit watches and steers in the component layer: the ends of life of the package's
// components, their live counts, and faults injected into the component factory.
#pragma once

#include <tcl.h>

#include <string>

namespace TestKit {

// Installs the instance observer and the factory filters; safe to call again.
void StartWatching() noexcept;

// The ends of life since the last call, oldest first, as a new list; they are forgotten.
Tcl_Obj* TakeEvents();

// The live counts of `testkit::live`, as a new dict.
Tcl_Obj* LiveCounts();

// Turns the fault WHAT on or off. False, with the reason in `error`, for an unknown WHAT.
bool SetFault(const std::string& what, bool on, std::string& error);

}  // namespace TestKit
