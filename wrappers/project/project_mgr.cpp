// The commands of the project manager: plain methods, count messages in the signature form.
#include "package/static_init.h"
#include "wrappers/classes.h"

namespace TcltaskI {
namespace {

using I = ITclProjectMgr;
constexpr auto Open = Plain("Open", 2, "CommonI::RESULT Open in out ", &I::Open);
constexpr auto OpenWithHelper = Plain("OpenWithHelper", 3, "CommonI::RESULT OpenWithHelper in in out ", &I::OpenWithHelper);
constexpr auto Close = Plain("Close", 2, "CommonI::RESULT Close in out ", &I::Close);
constexpr auto CloseCurrent = Plain("CloseCurrent", 1, "CommonI::RESULT CloseCurrent out ", &I::CloseCurrent);
constexpr auto GetCurrentTclProject = Plain("GetCurrentTclProject", 2, "CommonI::RESULT GetCurrentTclProject out out ", &I::GetCurrentTclProject);
constexpr auto GetCurrentHDProject = Plain("GetCurrentHDProject", 2, "CommonI::RESULT GetCurrentHDProject out out ", &I::GetCurrentHDProject);
constexpr auto GetCurrentProjectHelper = Plain("GetCurrentProjectHelper", 2, "CommonI::RESULT GetCurrentProjectHelper out out ", &I::GetCurrentProjectHelper);
constexpr auto SyncCurrent = Plain("SyncCurrent", 1, "CommonI::RESULT SyncCurrent out ", &I::SyncCurrent);
constexpr auto ReloadCurrent = Plain("ReloadCurrent", 1, "CommonI::RESULT ReloadCurrent out ", &I::ReloadCurrent);

using W = TclWrapITclProjectMgr;
constexpr auto rows = W::Rows<Open, OpenWithHelper, Close, CloseCurrent, GetCurrentTclProject,
                               GetCurrentHDProject, GetCurrentProjectHelper, SyncCurrent, ReloadCurrent>();

}  // namespace

const TclWrapITclProjectMgr::Table TclWrapITclProjectMgr::table{rows};

}  // namespace TcltaskI
