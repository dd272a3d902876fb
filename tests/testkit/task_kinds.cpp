// The table of the task interfaces the kit implements, in the order the package registers them.
#include <cstring>
#include <iterator>

#include "TcltaskI/ICollection.h"
#include "TcltaskI/IGlobal.h"
#include "TcltaskI/IGraphicalView.h"
#include "TcltaskI/IHighlight.h"
#include "TcltaskI/IObject.h"
#include "TcltaskI/ISearch.h"
#include "TcltaskI/ISelection.h"
#include "TcltaskI/ITclProject.h"
#include "TcltaskI/ITclProjectMgr.h"
#include "TcltaskI/ITimingAnalysis.h"
#include "TcltaskI/IXFloorplan.h"
#include "kit_kinds.h"

namespace TestKit {

namespace {

constexpr TaskKind kTaskKinds[] = {
    {"ITclProject", TcltaskI::ITclProjectID, &MakeTclProject},
    {"ICollection", TcltaskI::ICollectionID, &MakeCollection},
    {"IGlobal", TcltaskI::IGlobalID, &MakeGlobal},
    {"IGraphicalView", TcltaskI::IGraphicalViewID, &MakeGraphicalView},
    {"IHighlight", TcltaskI::IHighlightID, &MakeHighlight},
    {"IObject", TcltaskI::IObjectID, &MakeObject},
    {"ISearch", TcltaskI::ISearchID, &MakeSearch},
    {"ISelection", TcltaskI::ISelectionID, &MakeSelection},
    {"ITclProjectMgr", TcltaskI::ITclProjectMgrID, &MakeTclProjectMgr},
    {"ITimingAnalysis", TcltaskI::ITimingAnalysisID, &MakeTimingAnalysis},
    {"IXFloorplan", TcltaskI::IXFloorplanID, &MakeXFloorplan},
};

}  // namespace

const TaskKind* FindTaskKind(const char* name) noexcept {
    for (const TaskKind& kind : kTaskKinds)
        if (std::strcmp(kind.name, name) == 0) return &kind;
    return nullptr;
}

std::string TaskKindNames() {
    std::string names;
    for (std::size_t n = 0; n < std::size(kTaskKinds); ++n) {
        if (n > 0) names += n + 1 == std::size(kTaskKinds) ? " or " : ", ";
        names += kTaskKinds[n].name;
    }
    return names;
}

}  // namespace TestKit
