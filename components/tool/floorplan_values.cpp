// The Tcl values a floorplan answers with.
#include "floorplan_values.h"

#include <algorithm>
#include <utility>

#include "property.h"

namespace kelmartool {

const std::vector<std::string> kFloorplanProperties{"name",          "design",   "device",    "columns",     "rows",
                                                    "site_capacity", "banks",    "sso_limit", "clock_limit", "blocks",
                                                    "prohibited",    "modified", "view"};
const std::vector<std::string> kBlockProperties{"name", "cells", "size", "region", "capacity", "sites", "constraints"};

std::vector<std::string> BlockList(const FloorplanConstraints& c) {
    std::vector<std::string> names;
    for (const Block& b : c.blocks) names.push_back(b.name);
    return names;
}

std::vector<std::string> SiteOrder(const std::set<std::string>& sites) {
    std::vector<std::pair<std::pair<int, int>, std::string>> keyed;
    for (const std::string& s : sites) {
        int x = 0, y = 0;
        ParseSiteName(s, x, y);
        keyed.push_back({{y, x}, s});
    }
    std::sort(keyed.begin(), keyed.end());
    std::vector<std::string> out;
    for (auto& [key, s] : keyed) out.push_back(std::move(s));
    return out;
}

Region WholeDevice(const Device& d) { return Region{0, 0, d.columns - 1, d.rows - 1}; }

Region ClampToDevice(const Region& r, const Device& d) {
    Region out{std::max(r.x0, 0), std::max(r.y0, 0), std::min(r.x1, d.columns - 1), std::min(r.y1, d.rows - 1)};
    if (out.x0 > out.x1 || out.y0 > out.y1) return WholeDevice(d);
    return out;
}

Tcl_Obj* BlockProperty(const FloorplanData& plan, const Block& b, const std::string& key) {
    const auto region = RegionOf(b);
    if (key == "name") return NewText(b.name);
    if (key == "cells") return NewList(b.cells);
    if (key == "size") return NewInt(static_cast<long long>(b.cells.size()));
    if (key == "region") return NewText(region ? RegionText(*region) : std::string());
    if (key == "capacity") {
        const auto capacity = CapacityOf(b, plan);
        return capacity ? NewInt(*capacity) : NewText("");
    }
    if (key == "sites") return NewInt(region ? region->Sites() : 0);
    DictBuilder d;
    for (const auto& [k, v] : b.constraints) d.Add(k, v);
    return d.Take();
}

Tcl_Obj* BlockValue(const FloorplanData& plan, const Block& b) {
    DictBuilder d;
    for (const std::string& key : kBlockProperties)
        if (key != "name") d.Add(key, BlockProperty(plan, b, key));
    return d.Take();
}

Tcl_Obj* ViewValue(const FloorplanData& plan, const Region& view) {
    std::vector<std::string> visible;
    for (const Block& b : plan.constraints.blocks)
        if (auto r = RegionOf(b); r && r->Overlaps(view)) visible.push_back(b.name);
    return DictBuilder()
        .Add("x0", view.x0)
        .Add("y0", view.y0)
        .Add("x1", view.x1)
        .Add("y1", view.y1)
        .Add("region", RegionText(view))
        .Add("blocks", NewList(visible))
        .Take();
}

Tcl_Obj* FindingValue(const DrcFinding& f, const FloorplanData&) {
    return DictBuilder().Add("rule", f.rule).Add("objects", NewList(f.objects)).Add("message", f.message).Take();
}

Tcl_Obj* SsoBankValue(const SsoBank& b, const FloorplanData&) {
    const bool over = b.limit > 0 && static_cast<int>(b.outputs.size()) > b.limit;
    return DictBuilder()
        .Add("bank", b.bank)
        .Add("outputs", b.outputs.size())
        .Add("limit", b.limit)
        .Add("status", over ? "over" : "ok")
        .Add("ports", NewList(b.outputs))
        .Take();
}

Tcl_Obj* ClockRegionValue(const ClockRegion& r, const FloorplanData& plan) {
    const bool over = plan.clockLimit > 0 && static_cast<int>(r.nets.size()) > plan.clockLimit;
    return DictBuilder()
        .Add("block", r.block)
        .Add("region", RegionText(r.region))
        .Add("nets", NewList(r.nets))
        .Add("count", r.nets.size())
        .Add("limit", plan.clockLimit)
        .Add("status", over ? "over" : "ok")
        .Take();
}

Tcl_Obj* FloorplanProperty(const ToolState& state, const FloorplanData& plan, const std::string& key) {
    const Device& d = plan.device;
    if (key == "name") return NewText(plan.name);
    if (key == "design") {
        const Design* design = state.CurrentDesign();
        return NewText(design ? design->name : std::string());
    }
    if (key == "device") return NewText(d.name);
    if (key == "columns") return NewInt(d.columns);
    if (key == "rows") return NewInt(d.rows);
    if (key == "site_capacity") return NewInt(d.siteCapacity);
    if (key == "banks") {
        std::vector<std::string> names;
        for (const Bank& b : d.banks) names.push_back(b.name);
        return NewList(names);
    }
    if (key == "sso_limit") {
        DictBuilder limits;
        for (const Bank& b : d.banks) limits.Add(b.name, b.ssoLimit);
        return limits.Take();
    }
    if (key == "clock_limit") return NewInt(plan.clockLimit);
    if (key == "blocks") return NewList(BlockList(plan.constraints));
    if (key == "prohibited") return NewList(SiteOrder(plan.constraints.prohibited));
    if (key == "modified") return NewBool(plan.modified);
    return ViewValue(plan, plan.view);
}

Tcl_Obj* FloorplanValue(const ToolState& state, const FloorplanData& plan) {
    DictBuilder d;
    for (const std::string& key : kFloorplanProperties) d.Add(key, FloorplanProperty(state, plan, key));
    return d.Take();
}

}  // namespace kelmartool
