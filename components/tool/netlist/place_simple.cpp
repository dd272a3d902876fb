// A first, legal placement of an imported design: ports on the edge of the device (inputs from the
// west, outputs from the east), cells one a site on the logic sites inside, column by column in
// the order a signal reaches them from the inputs; then the cells are annealed to a short wire
// length (place_anneal.cpp).
#include <algorithm>
#include <cmath>
#include <deque>
#include <limits>

#include "netlist.h"
#include "seeded_random.h"
#include "timing_model.h"

namespace kelmartool {

namespace {

// The annealing keeps a word for every logic site: a device beyond this (a small -utilization, a
// huge -device) is refused rather than left to exhaust the memory.
constexpr long long kMaxPlacedSites = 10'000'000;

// The cells in the order of their distance, in nets, from the input ports; the cells of one
// distance shuffled by the seed, the cells no input reaches last.
std::vector<std::size_t> CellOrder(const Design& design, std::uint64_t seed) {
    const std::size_t count = design.cells.size();
    std::map<std::string_view, std::size_t> cellIndex;
    for (std::size_t i = 0; i < count; ++i) cellIndex.emplace(design.cells[i].name, i);
    std::map<std::string_view, std::vector<std::size_t>> driven;  // driver -> nets
    for (std::size_t n = 0; n < design.nets.size(); ++n) driven[design.nets[n].driver].push_back(n);

    std::vector<bool> seen(count, false);
    std::vector<std::size_t> order, level;
    const auto reach = [&](const std::string& from, std::vector<std::size_t>& next) {
        const auto it = driven.find(from);
        if (it == driven.end()) return;
        for (std::size_t n : it->second)
            for (const std::string& load : design.nets[n].loads)
                if (const auto c = cellIndex.find(load); c != cellIndex.end() && !seen[c->second]) {
                    seen[c->second] = true;
                    next.push_back(c->second);
                }
    };
    std::uint64_t state = seed;
    const auto shuffle = [&](std::vector<std::size_t>& items) {
        for (std::size_t i = items.size(); i > 1; --i) std::swap(items[i - 1], items[NextRandom(state) % i]);
    };
    for (const IoPort& port : design.ports)
        if (!port.output) reach(port.name, level);
    for (std::size_t start = 0; start < count || !level.empty();) {
        if (level.empty()) {  // what no input reaches: from the first cell not yet placed
            while (start < count && seen[start]) ++start;
            if (start == count) break;
            seen[start] = true;
            level.push_back(start);
        }
        shuffle(level);
        std::vector<std::size_t> next;
        for (std::size_t c : level) {
            order.push_back(c);
            reach(design.cells[c].name, next);
        }
        level = std::move(next);
    }
    return order;
}

// Half the perimeter of the box around the sites of a net's driver and loads.
int NetSpan(const Design& design, const Net& net) {
    int x0 = std::numeric_limits<int>::max(), y0 = x0, x1 = -1, y1 = -1;
    const auto add = [&](const std::string& name) {
        const Cell* cell = design.FindCell(name);
        const IoPort* port = cell ? nullptr : design.FindPort(name);
        const std::string* site = cell ? &cell->site : port ? &port->site : nullptr;
        if (!site) return;
        if (const auto at = design.device.ParseSite(*site)) {
            x0 = std::min(x0, at->x), x1 = std::max(x1, at->x);
            y0 = std::min(y0, at->y), y1 = std::max(y1, at->y);
        }
    };
    add(net.driver);
    for (const std::string& load : net.loads) add(load);
    return x1 < 0 ? 0 : (x1 - x0) + (y1 - y0);
}

}  // namespace

std::string PlaceSimple(Design& design, const NetlistOptions& options) {
    const std::size_t cells = design.cells.size(), ports = design.ports.size();
    int columns = options.columns, rows = options.rows;
    const std::uint64_t seed = options.seed;
    if (columns == 0 || rows == 0) {
        // Square, with room for the cells inside and the ports on the edge (corners left free).
        const double inside = std::ceil(std::sqrt(static_cast<double>(cells) / options.utilization));
        if (!(inside <= kMaxSide)) return "the design needs a device wider than " + std::to_string(kMaxSide) + " sites";
        const auto inner = static_cast<long long>(inside);
        const auto side = std::max({inner, static_cast<long long>((ports + 3) / 4), 1LL}) + 2;
        if (side > kMaxSide) return "the design needs a device wider than " + std::to_string(kMaxSide) + " sites";
        columns = rows = static_cast<int>(side);
    }
    const auto logicSites = static_cast<long long>(columns - 2) * (rows - 2);
    const long long edgeSites = 2LL * (columns - 2) + 2LL * (rows - 2);
    const std::string size = std::to_string(columns) + "x" + std::to_string(rows);
    if (columns < 3 || rows < 3 || columns > kMaxSide || rows > kMaxSide)
        return "the device " + size + " must have from 3 to " + std::to_string(kMaxSide) + " columns and rows";
    if (logicSites > kMaxPlacedSites)
        return "the device " + size + " has " + std::to_string(logicSites) + " logic sites, more than the " +
               std::to_string(kMaxPlacedSites) + " a placement takes";
    if (logicSites < static_cast<long long>(cells))
        return "the device " + size + " has " + std::to_string(logicSites) + " logic sites for " + std::to_string(cells) +
               " cells";
    if (edgeSites < static_cast<long long>(ports))
        return "the device " + size + " has " + std::to_string(edgeSites) + " IO sites for " + std::to_string(ports) +
               " ports";

    design.device = Device{};
    design.device.name = "grid-" + size;
    design.device.columns = columns;
    design.device.rows = rows;
    design.device.siteCapacity = 1;

    // The edge without its corners, as inputs fill it: west, south, north, east (from top to bottom
    // and left to right); outputs fill it the other way round.
    std::vector<SiteRef> edge;
    for (int y = rows - 2; y >= 1; --y) edge.push_back({0, y});
    for (int x = 1; x <= columns - 2; ++x) edge.push_back({x, 0});
    for (int x = 1; x <= columns - 2; ++x) edge.push_back({x, rows - 1});
    for (int y = rows - 2; y >= 1; --y) edge.push_back({columns - 1, y});
    std::size_t front = 0, back = edge.size();
    for (IoPort& port : design.ports) port.site = Device::SiteName(port.output ? edge[--back] : edge[front++]);

    // Column by column, down one and up the next, so that cells next in the order stay neighbours.
    const int height = rows - 2;
    const std::vector<std::size_t> order = CellOrder(design, seed);
    for (std::size_t k = 0; k < order.size(); ++k) {
        const int column = static_cast<int>(k / static_cast<std::size_t>(height));
        const int step = static_cast<int>(k % static_cast<std::size_t>(height));
        const int y = column % 2 == 0 ? 1 + step : height - step;
        design.cells[order[k]].site = Device::SiteName(1 + column, y);
    }

    // Then the cells are annealed to a short wire length.
    long long start = 0, placed = 0;
    if (std::string problem = PlaceAnneal(design, seed, start, placed); !problem.empty()) return problem;
    if (std::string problem = design.Index(); !problem.empty()) return problem;
    // One delay a net, as the model holds one, from its span: the half perimeter of its box, which
    // is no shorter than the distance from the driver to its farthest load nor than the least wire
    // that joins all its ends.
    long long wireLength = 0;
    for (Net& net : design.nets) {
        const int span = NetSpan(design, net);
        wireLength += span;
        net.delay = RoundTime(options.library.NetDelay(span));
    }
    design.properties["wire_length"] = std::to_string(wireLength);
    design.properties["wire_length_start"] = std::to_string(start);
    return {};
}

}  // namespace kelmartool
