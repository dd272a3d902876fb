// The checks and analyses of a floorplan: design rules, simultaneous switching outputs per bank and
// clock nets per region. Each looks at the floorplan's working copy on its own device, with the
// cells where the design places them.
#include <algorithm>
#include <charconv>
#include <map>
#include <set>
#include <string>

#include "floorplan_model.h"

namespace kelmartool {

namespace {

std::string Quote(const std::string& name) { return "'" + name + "'"; }

bool Inside(const Device& device, const Region& r) {
    return device.OnDevice(r.x0, r.y0) && device.OnDevice(r.x1, r.y1);
}

}  // namespace

std::optional<long long> ParseCapacity(const std::string& value) {
    long long n = 0;
    const auto [end, ec] = std::from_chars(value.data(), value.data() + value.size(), n);
    if (ec != std::errc() || end != value.data() + value.size() || n < 0) return std::nullopt;
    return n;
}

std::string CheckBlockConstraint(const std::string& name, const std::string& value) {
    if (name == "region") {
        Region r;
        std::string error;
        return ParseRegion(value, r, error) ? std::string() : error;
    }
    if (name == "capacity") {
        if (!ParseCapacity(value)) return "a capacity must be a whole number of at least 0, not '" + value + "'";
        return {};
    }
    if (name == "comment") return {};
    return "unknown block constraint '" + name + "': use region, capacity or comment";
}

std::string CheckConstraints(const Design& design, const Device& device, const FloorplanConstraints& c) {
    std::map<std::string, std::string> owner;  // cell -> block
    for (const Block& b : c.blocks) {
        if (b.name.empty() || b.name.find_first_of(" \t\n") != std::string::npos)
            return "a block name must be one word, not '" + b.name + "'";
        for (const std::string& cell : b.cells) {
            if (!design.FindCell(cell))
                return "block " + Quote(b.name) + " holds " + Quote(cell) + ", which is no cell";
            auto [it, fresh] = owner.emplace(cell, b.name);
            if (!fresh && it->second != b.name)
                return "cell " + Quote(cell) + " is in the blocks " + Quote(it->second) + " and " + Quote(b.name);
        }
        for (const auto& [key, value] : b.constraints)
            if (std::string problem = CheckBlockConstraint(key, value); !problem.empty())
                return "block " + Quote(b.name) + ": " + problem;
    }
    for (const std::string& site : c.prohibited)
        if (!device.ParseSite(site)) return "the prohibited site " + Quote(site) + " is no site of the device";
    for (const auto& [port, site] : c.ports) {
        if (!design.FindPort(port)) return Quote(port) + " is no port of the design";
        if (!device.ParseSite(site))
            return "port " + Quote(port) + " is placed on " + Quote(site) + ", which is no site of the device";
    }
    return {};
}

std::optional<long long> CapacityOf(const Block& block, const FloorplanData& plan) {
    if (auto it = block.constraints.find("capacity"); it != block.constraints.end())
        return ParseCapacity(it->second).value_or(0);
    const auto region = RegionOf(block);
    if (!region) return std::nullopt;
    // The sites of the region on the device less the prohibited ones among them: a walk over the
    // prohibited sites, not over the region, which may hold billions of sites.
    const Region on{std::max(region->x0, 0), std::max(region->y0, 0), std::min(region->x1, plan.device.columns - 1),
                    std::min(region->y1, plan.device.rows - 1)};
    if (on.x0 > on.x1 || on.y0 > on.y1) return 0;
    long long free = on.Sites();
    for (const std::string& site : plan.constraints.prohibited) {
        int x = 0, y = 0;
        if (ParseSiteName(site, x, y) && on.Contains(x, y)) --free;
    }
    return free * plan.device.siteCapacity;
}

std::vector<DrcFinding> RunDrc(const Design& design, const FloorplanData& plan) {
    std::vector<DrcFinding> out;
    const Device& device = plan.device;
    const auto& blocks = plan.constraints.blocks;
    const std::string size = std::to_string(device.columns) + " x " + std::to_string(device.rows) + " sites";
    auto onDevice = [&device](const std::string& site) {
        int x = 0, y = 0;
        return ParseSiteName(site, x, y) && device.OnDevice(x, y);
    };

    for (const Block& b : blocks)
        if (auto r = RegionOf(b); r && !Inside(device, *r))
            out.push_back({"out_of_device",
                           {b.name},
                           "block " + Quote(b.name) + " has the region " + RegionText(*r) +
                               ", which reaches beyond the device (" + size + ")"});
    for (const Cell& c : design.cells)
        if (!c.site.empty() && !onDevice(c.site))
            out.push_back(
                {"out_of_device",
                 {c.name, c.site},
                 "cell " + Quote(c.name) + " is placed on " + c.site + ", which is not on the device (" + size + ")"});
    for (const auto& [port, site] : plan.constraints.ports)
        if (!onDevice(site))
            out.push_back(
                {"out_of_device",
                 {port, site},
                 "port " + Quote(port) + " is placed on " + site + ", which is not on the device (" + size + ")"});

    for (std::size_t i = 0; i < blocks.size(); ++i)
        for (std::size_t j = i + 1; j < blocks.size(); ++j) {
            const auto a = RegionOf(blocks[i]), b = RegionOf(blocks[j]);
            if (a && b && a->Overlaps(*b))
                out.push_back({"overlap",
                               {blocks[i].name, blocks[j].name},
                               "the regions of blocks " + Quote(blocks[i].name) + " (" + RegionText(*a) + ") and " +
                                   Quote(blocks[j].name) + " (" + RegionText(*b) + ") overlap"});
        }

    for (const Cell& c : design.cells)
        if (plan.constraints.prohibited.count(c.site))
            out.push_back({"prohibited_site",
                           {c.name, c.site},
                           "cell " + Quote(c.name) + " is placed on the prohibited site " + c.site});
    for (const auto& [port, site] : plan.constraints.ports)
        if (plan.constraints.prohibited.count(site))
            out.push_back(
                {"prohibited_site", {port, site}, "port " + Quote(port) + " is placed on the prohibited site " + site});

    for (const Block& b : blocks) {
        const auto r = RegionOf(b);
        if (!r) continue;
        for (const std::string& name : b.cells) {
            const Cell* c = design.FindCell(name);
            int x = 0, y = 0;
            if (c && ParseSiteName(c->site, x, y) && !r->Contains(x, y))
                out.push_back({"outside_region",
                               {name, b.name},
                               "cell " + Quote(name) + " of block " + Quote(b.name) + " is placed on " + c->site +
                                   ", outside the region " + RegionText(*r)});
        }
    }

    for (const Block& b : blocks) {
        const auto capacity = CapacityOf(b, plan);
        const auto held = static_cast<long long>(b.cells.size());
        if (capacity && held > *capacity)
            out.push_back({"capacity",
                           {b.name},
                           "block " + Quote(b.name) + " holds " + std::to_string(held) + " cells but has room for " +
                               std::to_string(*capacity)});
    }
    return out;
}

std::vector<SsoBank> RunSso(const Design& design, const FloorplanData& plan) {
    std::vector<SsoBank> out;
    for (const Bank& bank : plan.device.banks) {
        SsoBank entry{bank.name, {}, bank.ssoLimit};
        for (const IoPort& port : design.ports) {
            auto it = plan.constraints.ports.find(port.name);
            int x = 0, y = 0;
            if (port.output && it != plan.constraints.ports.end() && ParseSiteName(it->second, x, y) &&
                bank.Contains(x, y))
                entry.outputs.push_back(port.name);
        }
        out.push_back(std::move(entry));
    }
    return out;
}

std::vector<ClockRegion> RunClockAnalysis(const Design& design, const FloorplanData& plan) {
    std::vector<ClockRegion> out;
    for (const Block& b : plan.constraints.blocks) {
        const auto r = RegionOf(b);
        if (!r) continue;
        std::set<std::string> nets;
        for (const Cell& c : design.cells) {
            int x = 0, y = 0;
            if (!c.sequential || c.clock.empty() || !ParseSiteName(c.site, x, y) || !r->Contains(x, y)) continue;
            const Clock* clock = design.FindClock(c.clock);
            nets.insert(clock && !clock->net.empty() ? clock->net : c.clock);
        }
        out.push_back({b.name, *r, std::vector<std::string>(nets.begin(), nets.end())});
    }
    return out;
}

}  // namespace kelmartool
