// Kit projects, project managers, the design-data face of a project and named components.
#include "HdcI/IHDProject.h"
#include "TcltaskI/ITclProject.h"
#include "TcltaskI/ITclProjectMgr.h"
#include "kit_kinds.h"
#include "kit_object.h"

namespace TestKit {

namespace {

using CommonI::RESULT;
using Dpm::IProjectHelper;

class KitTclProject final : public KitObject<TcltaskI::ITclProject> {
public:
    using KitObject::KitObject;

    RESULT OpenWithHelper(const Port_String& f, IProjectHelper* h, Port_String& m) override { KIT_OP(OpenWithHelper, f, h, m); }
    RESULT Close() override { KIT_OP(Close); }
    Port_String GetFileName() override { KIT_OP(GetFileName); }
    HdcI::MIHDProject GetHDProject() override { KIT_OP(GetHDProject); }
    IProjectHelper* GetProjectHelper() override { KIT_OP(GetProjectHelper); }
    RESULT Sync(Port_String& m) override { KIT_OP(Sync, m); }
    RESULT Reload(Port_String& m) override { KIT_OP(Reload, m); }
    RESULT RegisterComponent(const Port::XUID& id, CitI::MIInterface& c) override { KIT_OP(RegisterComponent, id, c); }
    RESULT UnRegisterComponent(CitI::MIInterface& c) override { KIT_OP(UnRegisterComponent, c); }
    CitI::MIInterface GetComponent(const Port::XUID& id) override { KIT_OP(GetComponent, id); }
};

class KitTclProjectMgr final : public KitObject<TcltaskI::ITclProjectMgr> {
public:
    using KitObject::KitObject;
    using Project = CommonI::RefCountPtr<TcltaskI::ITclProject>;

    RESULT Open(const Port_String& f, Port_String& m) override { KIT_OP(Open, f, m); }
    RESULT OpenWithHelper(const Port_String& f, IProjectHelper* h, Port_String& m) override { KIT_OP(OpenWithHelper, f, h, m); }
    RESULT Close(const Port_String& f, Port_String& m) override { KIT_OP(Close, f, m); }
    RESULT CloseCurrent(Port_String& m) override { KIT_OP(CloseCurrent, m); }
    RESULT GetCurrentTclProject(Project& p, Port_String& m) override { KIT_OP(GetCurrentTclProject, p, m); }
    RESULT GetCurrentHDProject(HdcI::MIHDProject& p, Port_String& m) override { KIT_OP(GetCurrentHDProject, p, m); }
    RESULT GetCurrentProjectHelper(IProjectHelper*& h, Port_String& m) override { KIT_OP(GetCurrentProjectHelper, h, m); }
    RESULT SyncCurrent(Port_String& m) override { KIT_OP(SyncCurrent, m); }
    RESULT ReloadCurrent(Port_String& m) override { KIT_OP(ReloadCurrent, m); }
};

class KitHDProject final : public KitObject<HdcI::IHDProject> {
public:
    using KitObject::KitObject;

    Port_String GetName() override { KIT_OP(GetName); }
    Port_String GetFileName() override { KIT_OP(GetFileName); }
};

// Answers nothing but CitI::IInterface and the count; `testkit::calls` shows it was never called.
using KitComponent = KitObject<CitI::IInterface>;

}  // namespace

CitI::IInterface* MakeTclProject(const KitSetup& setup) { return Make<KitTclProject>(setup); }
CitI::IInterface* MakeTclProjectMgr(const KitSetup& setup) { return Make<KitTclProjectMgr>(setup); }
CitI::IInterface* MakeHDProject(Tcl_Interp* interp) { return Make<KitHDProject>(KitSetup{interp}); }

CitI::IInterface* MakeComponent(const std::string& name, Tcl_Interp* interp) {
    return new KitComponent(KitSetup{interp}, name);
}

}  // namespace TestKit
