// The package entry's list of wrapper factories.
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

namespace TcltaskI {

// Registers a new factory for each of the eleven task interfaces, under its identifier. The
// factories stay registered for the life of the process.
void RegisterWrapperFactories();

}  // namespace TcltaskI
