// The eleven wrapper classes. Each is a handle of its task interface with a command table; the table
// and its declarations stand in the class's own source file.
#pragma once

#include "TcltaskI/ICollection.h"
#include "TcltaskI/IGlobal.h"
#include "TcltaskI/IGraphicalView.h"
#include "TcltaskI/IHighlight.h"
#include "TcltaskI/IObject.h"
#include "TcltaskI/ISearch.h"
#include "TcltaskI/ISelection.h"
#include "TcltaskI/ITclProjectMgr.h"
#include "TcltaskI/ITimingAnalysis.h"
#include "TcltaskI/IXFloorplan.h"
#include "package/wrapper.h"

namespace TcltaskI {

#define KELMAR_WRAPPER(X, FORM, COMPARE)                                      \
    class TclWrap##X final : public TclWrap<TclWrap##X, X, FORM, COMPARE> {   \
    public:                                                                   \
        using TclWrap::TclWrap;                                               \
        static constexpr const char* kClassName = "TcltaskI::TclWrap" #X;     \
        static const Table table;                                             \
    }

KELMAR_WRAPPER(ITclProject, CountMessage::Signature, WordCompare::UtStr);
KELMAR_WRAPPER(ICollection, CountMessage::Help, WordCompare::Bytes);
KELMAR_WRAPPER(IGlobal, CountMessage::Help, WordCompare::Bytes);
KELMAR_WRAPPER(IGraphicalView, CountMessage::Signature, WordCompare::Bytes);
KELMAR_WRAPPER(IHighlight, CountMessage::Help, WordCompare::Bytes);
KELMAR_WRAPPER(IObject, CountMessage::Help, WordCompare::Bytes);
KELMAR_WRAPPER(ISearch, CountMessage::Help, WordCompare::Bytes);
KELMAR_WRAPPER(ISelection, CountMessage::Help, WordCompare::Bytes);
KELMAR_WRAPPER(ITclProjectMgr, CountMessage::Signature, WordCompare::Bytes);
KELMAR_WRAPPER(ITimingAnalysis, CountMessage::Help, WordCompare::Bytes);
KELMAR_WRAPPER(IXFloorplan, CountMessage::Help, WordCompare::Bytes);

#undef KELMAR_WRAPPER

}  // namespace TcltaskI
