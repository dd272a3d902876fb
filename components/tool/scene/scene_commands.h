// The Tcl commands of the scene: kelmartool::scene and kelmartool::snapshot.
#pragma once

#include <tcl.h>

namespace kelmartool {

void CreateSceneCommands(Tcl_Interp* interp);

}  // namespace kelmartool
