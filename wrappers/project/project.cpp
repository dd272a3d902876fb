// The commands of a project: plain methods, compared with UT_STR::_Compare, count messages in the
// signature form.
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {
namespace {

using I = ITclProject;
constexpr auto OpenWithHelper = Plain("OpenWithHelper", 3, "CommonI::RESULT OpenWithHelper in in out ", &I::OpenWithHelper);
constexpr auto Close = Plain("Close", 0, "CommonI::RESULT Close ", &I::Close);
constexpr auto GetFileName = Plain("GetFileName", 0, "Port_String GetFileName ", &I::GetFileName);
constexpr auto GetHDProject = Plain("GetHDProject", 0, "HdcI::MIHDProject GetHDProject ", &I::GetHDProject);
constexpr auto GetProjectHelper = Plain("GetProjectHelper", 0, "Dpm::IProjectHelper * GetProjectHelper ", &I::GetProjectHelper);
constexpr auto Sync = Plain("Sync", 1, "CommonI::RESULT Sync out ", &I::Sync);
constexpr auto Reload = Plain("Reload", 1, "CommonI::RESULT Reload out ", &I::Reload);
constexpr auto RegisterComponent = Plain("RegisterComponent", 2, "CommonI::RESULT RegisterComponent in inout ", &I::RegisterComponent);
constexpr auto UnRegisterComponent = Plain("UnRegisterComponent", 1, "CommonI::RESULT UnRegisterComponent inout ", &I::UnRegisterComponent);
constexpr auto GetComponent = Plain("GetComponent", 1, "CitI::MIInterface GetComponent in ", &I::GetComponent);

using W = TclWrapITclProject;
constexpr auto rows = W::Rows<OpenWithHelper, Close, GetFileName, GetHDProject, GetProjectHelper, Sync,
                               Reload, RegisterComponent, UnRegisterComponent, GetComponent>();

}  // namespace

const TclWrapITclProject::Table TclWrapITclProject::table{rows};

}  // namespace TcltaskI
