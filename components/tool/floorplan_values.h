// The Tcl values a floorplan answers with: its settings, its blocks and its view.
#pragma once

#include <tcl.h>

#include <set>
#include <string>
#include <vector>

#include "floorplan_model.h"

namespace kelmartool {

// The settings of a floorplan in the order `properties` gives them, and the properties of a block.
extern const std::vector<std::string> kFloorplanProperties;
extern const std::vector<std::string> kBlockProperties;

// Each gives a new value without references.
Tcl_Obj* FloorplanProperty(const ToolState& state, const FloorplanData& plan, const std::string& key);
// Every setting of a floorplan, as a dict in the order of kFloorplanProperties.
Tcl_Obj* FloorplanValue(const ToolState& state, const FloorplanData& plan);
Tcl_Obj* BlockProperty(const FloorplanData& plan, const Block& block, const std::string& key);
// Every property of a block but its name, as a dict.
Tcl_Obj* BlockValue(const FloorplanData& plan, const Block& block);
// The view's corners and the blocks whose regions it shows.
Tcl_Obj* ViewValue(const FloorplanData& plan, const Region& view);
// One item of an analysis's answer, as a dict: a drc finding, an sso bank, a clock region.
Tcl_Obj* FindingValue(const DrcFinding& finding, const FloorplanData& plan);
Tcl_Obj* SsoBankValue(const SsoBank& bank, const FloorplanData& plan);
Tcl_Obj* ClockRegionValue(const ClockRegion& region, const FloorplanData& plan);

std::vector<std::string> BlockList(const FloorplanConstraints& constraints);
// Sites in the order of the device: row by row.
std::vector<std::string> SiteOrder(const std::set<std::string>& sites);
Region WholeDevice(const Device& device);
// The part of a region on the device; the whole device when nothing of it is.
Region ClampToDevice(const Region& region, const Device& device);

}  // namespace kelmartool
