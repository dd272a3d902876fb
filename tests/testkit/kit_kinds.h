// The kinds of object the kit makes, and the makers behind `testkit::new`, `testkit::component` and
// the objects that operations hand out. Every maker gives a new object with no reference taken.
#pragma once

#include <string>

#include "Dpm/IProjectHelper.h"
#include "kit_core.h"

namespace TestKit {

using MakeFunction = CitI::IInterface* (*)(const KitSetup& setup);

// One task interface the kit implements.
struct TaskKind {
    const char* name;  // the IFACE word of `testkit::new`
    Port::XUIDLiteral id;
    MakeFunction make;
};

// The kind of the task interface called `name`, or null.
const TaskKind* FindTaskKind(const char* name) noexcept;
// The names of all kinds, for messages: "ITclProject, ICollection, ... or IXFloorplan".
std::string TaskKindNames();

CitI::IInterface* MakeTclProject(const KitSetup& setup);
CitI::IInterface* MakeTclProjectMgr(const KitSetup& setup);
CitI::IInterface* MakeCollection(const KitSetup& setup);
CitI::IInterface* MakeGlobal(const KitSetup& setup);
CitI::IInterface* MakeObject(const KitSetup& setup);
CitI::IInterface* MakeGraphicalView(const KitSetup& setup);
CitI::IInterface* MakeHighlight(const KitSetup& setup);
CitI::IInterface* MakeSelection(const KitSetup& setup);
CitI::IInterface* MakeSearch(const KitSetup& setup);
CitI::IInterface* MakeTimingAnalysis(const KitSetup& setup);
CitI::IInterface* MakeXFloorplan(const KitSetup& setup);

// The design-data face of a project; it answers HdcI::IHDProject.
CitI::IInterface* MakeHDProject(Tcl_Interp* interp);
// A counted component with a name and no interface of its own.
CitI::IInterface* MakeComponent(const std::string& name, Tcl_Interp* interp);

// The one project helper of this name, made on first use and kept for the process.
Dpm::IProjectHelper* HelperNamed(const std::string& name);
// The one object of the task interface `kind` that does not answer that interface, kept for the
// process: a factory makes a wrapper of it that holds no object.
CitI::IInterface* OrphanOf(const TaskKind& kind);

}  // namespace TestKit
