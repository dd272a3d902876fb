// The scene: which objects of the tool state a picture of one rectangle shows, where and in which
// colours.
#include "scene.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <iterator>
#include <map>
#include <optional>
#include <set>
#include <string_view>

#include "floorplan_model.h"
#include "timing_model.h"

namespace kelmartool {

const char* SceneKindWord(SceneKind kind) noexcept {
    switch (kind) {
        case SceneKind::Device: return "device";
        case SceneKind::Grid: return "grid";
        case SceneKind::Bank: return "bank";
        case SceneKind::Prohibited: return "prohibited";
        case SceneKind::Block: return "block";
        case SceneKind::Site: return "site";
        case SceneKind::Cell: return "cell";
        case SceneKind::Density: return "density";
        case SceneKind::Port: return "port";
        case SceneKind::Net: return "net";
        case SceneKind::Path: return "path";
    }
    return "cell";
}

const char* CellTypeColor(const std::string& type) noexcept {
    if (type == "LUT") return "#8fb8de";
    if (type == "FF") return "#9bd39b";
    if (type == "BUFG") return "#e8c060";
    if (type == "RAM") return "#c8a2e8";
    if (type == "DSP") return "#e8a0a0";
    if (type == "IOB") return "#a0d8d0";
    return "#c8c8c8";
}

// A label goes where it fits: inside a small item, inside the top of a bank, and above a block,
// whose inside its cells fill.
std::optional<LabelSpot> PlaceLabel(const SceneItem& item, double px0, double py0, double px1, double py1) {
    if (item.label.empty() || item.kind == SceneKind::Device) return std::nullopt;
    const double wide = double(item.label.size()) * kLabelPixels * 0.6;
    const bool block = item.kind == SceneKind::Block;
    if (px1 - px0 < wide + 2 || (!block && py1 - py0 < kLabelPixels + 2)) return std::nullopt;
    const double baseline = block                          ? py0 - 3
                            : item.kind == SceneKind::Bank ? py0 + kLabelPixels + 1
                                                           : (py0 + py1) / 2 + kLabelPixels / 3;
    const bool filled = !block && item.kind != SceneKind::Bank && !item.fill.empty();
    return LabelSpot{(px0 + px1) / 2, baseline, block ? kBlockLabelColor : kLabelColor, filled ? &item.fill : nullptr};
}

Viewport ShownRect(const ToolState& state) {
    const ViewState& view = state.view;
    if (!view.history.empty() && view.position < view.history.size()) return view.history[view.position];
    const Design* design = state.CurrentDesign();
    if (design == nullptr) return {};
    return {0, 0, static_cast<double>(design->device.columns), static_cast<double>(design->device.rows)};
}

namespace {

constexpr int kGridLimit = 200;  // most sites a side for which the grid is ruled
constexpr double kCellInset = 0.1;
constexpr double kPortInset = 0.2;

// What the scene is made from, gathered once.
class SceneMaker {
public:
    SceneMaker(const ToolState& state, const Design& design, const Viewport& rect, NetLines nets)
        : m_state(state), m_design(design), m_rect(rect), m_nets(nets) {
        m_scene.rect = rect;
        const FloorplanData* plan = state.floorplan.get();
        m_plan = plan != nullptr && plan->open && plan->epoch == state.designEpoch ? plan : nullptr;
        m_selected.insert(state.selection.begin(), state.selection.end());
    }

    Scene Make() {
        Device();
        Banks();
        Prohibited();
        Cells();
        Blocks();
        Sites();
        Ports();
        Nets();
        WorstPath();
        std::stable_sort(m_scene.items.begin(), m_scene.items.end(),
                         [](const SceneItem& a, const SceneItem& b) { return a.layer < b.layer; });
        return std::move(m_scene);
    }

private:
    // Whether the box x0..x1, y0..y1 (site units) meets the rectangle.
    bool Meets(double x0, double y0, double x1, double y1) const {
        return x0 < m_rect.x + m_rect.width && x1 > m_rect.x && y0 < m_rect.y + m_rect.height && y1 > m_rect.y;
    }
    bool SiteMeets(const SiteRef& s) const { return Meets(s.x, s.y, s.x + 1, s.y + 1); }

    const std::string* Highlight(const std::string& name) const {
        auto it = m_state.highlight.find(name);
        return it == m_state.highlight.end() ? nullptr : &it->second;
    }
    bool Selected(const std::string& name) const { return m_selected.count(name) != 0; }

    // The fill of an object: its highlight colour, else `normal`; the outline: the selection's
    // colour when selected, else `normal`.
    std::string Fill(const std::string& name, std::string normal) const {
        const std::string* colour = Highlight(name);
        return colour ? *colour : normal;
    }
    std::string Outline(const std::string& name, std::string normal) const {
        return Selected(name) ? std::string(kSelectionColor) : normal;
    }

    void Add(SceneKind kind, std::string name, std::vector<double> coords, std::string fill, std::string outline,
             std::string label, int layer) {
        m_scene.items.push_back(
            SceneItem{kind, std::move(name), std::move(coords), std::move(fill), std::move(outline), std::move(label), layer});
    }

    void Device() {
        const kelmartool::Device& d = m_design.device;
        Add(SceneKind::Device, d.name, {0, 0, double(d.columns), double(d.rows)}, "#ffffff", "#404040", d.name,
            kLayerDevice);
        const double x0 = std::max(0.0, std::floor(m_rect.x)), y0 = std::max(0.0, std::floor(m_rect.y));
        const double x1 = std::min(double(d.columns), std::ceil(m_rect.x + m_rect.width));
        const double y1 = std::min(double(d.rows), std::ceil(m_rect.y + m_rect.height));
        if (x1 > x0 && y1 > y0 && x1 - x0 <= kGridLimit && y1 - y0 <= kGridLimit)
            Add(SceneKind::Grid, d.name + ".grid", {x0, y0, x1, y1}, "", "#e4e4e4", "", kLayerDevice);
    }

    void Banks() {
        for (const Bank& b : m_design.device.banks)
            if (Meets(b.x0, b.y0, b.x1 + 1, b.y1 + 1))
                Add(SceneKind::Bank, b.name, {double(b.x0), double(b.y0), double(b.x1 + 1), double(b.y1 + 1)},
                    Fill(b.name, "#f4efe0"), Outline(b.name, "#c0a060"), b.name, kLayerBank);
    }

    // Prohibited sites beyond the detail limit become bins too, grey, labelled with their count.
    void Prohibited() {
        const std::set<std::string>& sites = m_plan ? m_plan->constraints.prohibited : m_design.prohibited;
        std::map<SiteRef, std::size_t> shown;
        for (const std::string& name : sites) {
            int x = 0, y = 0;
            if (ParseSiteName(name, x, y) && m_design.device.OnDevice(x, y) && SiteMeets({x, y})) shown.emplace(SiteRef{x, y}, 1);
        }
        if (shown.size() > kDetailCellLimit) {
            Bins(shown, SceneKind::Prohibited, "prohibited", 1.0, "#707070", kLayerProhibited,
                 [](double) { return std::string("#b8b8b8"); });
            return;
        }
        for (const auto& [site, count] : shown)
            Add(SceneKind::Prohibited, Device::SiteName(site), {double(site.x), double(site.y), double(site.x + 1),
                double(site.y + 1)}, "#b8b8b8", "#707070", "", kLayerProhibited);
    }

    void Cells() {
        // The cells in view, by site, so that the cells sharing a site split it.
        std::map<SiteRef, std::vector<const Cell*>> bySite;
        for (const Cell& cell : m_design.cells) {
            if (cell.site.empty()) continue;
            const std::optional<SiteRef> site = m_design.device.ParseSite(cell.site);
            if (!site || !SiteMeets(*site)) continue;
            bySite[*site].push_back(&cell);
            ++m_scene.cellsInView;
        }
        if (m_scene.cellsInView > kDetailCellLimit) {
            m_scene.density = true;
            std::map<SiteRef, std::size_t> counts;
            for (const auto& [site, cells] : bySite) counts.emplace(site, cells.size());
            Bins(counts, SceneKind::Density, "density", double(std::max(1, m_design.device.siteCapacity)), "",
                 kLayerCell, Shade);
            return;
        }
        for (const auto& [site, cells] : bySite) {
            const double share = (1.0 - 2 * kCellInset) / double(cells.size());
            for (std::size_t i = 0; i < cells.size(); ++i) {
                const Cell& cell = *cells[i];
                const double x0 = site.x + kCellInset + share * double(i);
                Add(SceneKind::Cell, cell.name, {x0, site.y + kCellInset, x0 + share, site.y + 1 - kCellInset},
                    Fill(cell.name, CellTypeColor(cell.type)), Outline(cell.name, "#303030"), cell.name, kLayerCell);
            }
        }
    }

    // Bins of whole sites over the rectangle, at most kDensityBins a side, each an item of `kind`
    // named prefix.<column>.<row> and labelled with its count, filled by `fill` from the count over
    // the count the bin's sites can hold at `perSite` each.
    template <class Fill>
    void Bins(const std::map<SiteRef, std::size_t>& counts, SceneKind kind, const char* prefix, double perSite,
              const char* outline, int layer, Fill fill) {
        const kelmartool::Device& d = m_design.device;
        const int sx0 = std::max(0, int(std::floor(m_rect.x))), sy0 = std::max(0, int(std::floor(m_rect.y)));
        const int sx1 = std::min(d.columns, int(std::ceil(m_rect.x + m_rect.width)));
        const int sy1 = std::min(d.rows, int(std::ceil(m_rect.y + m_rect.height)));
        const int stepX = std::max(1, (sx1 - sx0 + kDensityBins - 1) / kDensityBins);
        const int stepY = std::max(1, (sy1 - sy0 + kDensityBins - 1) / kDensityBins);
        const int binsX = (sx1 - sx0 + stepX - 1) / stepX, binsY = (sy1 - sy0 + stepY - 1) / stepY;
        std::vector<std::size_t> bins(std::size_t(binsX) * std::size_t(binsY), 0);
        for (const auto& [site, count] : counts) {
            const int bx = (site.x - sx0) / stepX, by = (site.y - sy0) / stepY;
            bins[std::size_t(by) * std::size_t(binsX) + std::size_t(bx)] += count;
        }
        for (int by = 0; by < binsY; ++by)
            for (int bx = 0; bx < binsX; ++bx) {
                const std::size_t count = bins[std::size_t(by) * std::size_t(binsX) + std::size_t(bx)];
                if (count == 0) continue;
                const int x0 = sx0 + bx * stepX, y0 = sy0 + by * stepY;
                const int x1 = std::min(sx1, x0 + stepX), y1 = std::min(sy1, y0 + stepY);
                const double room = double(x1 - x0) * double(y1 - y0) * perSite;
                Add(kind, std::string(prefix) + "." + std::to_string(bx) + "." + std::to_string(by),
                    {double(x0), double(y0), double(x1), double(y1)}, fill(double(count) / room), outline,
                    std::to_string(count), layer);
            }
    }

    // From a pale blue at no cells to a dark blue at a full bin.
    static std::string Shade(double fraction) {
        fraction = std::clamp(fraction, 0.0, 1.0);
        auto channel = [fraction](int empty, int full) { return int(std::lround(empty + (full - empty) * fraction)); };
        char text[8];
        std::snprintf(text, sizeof text, "#%02x%02x%02x", channel(0xe8, 0x10), channel(0xf0, 0x30), channel(0xff, 0x90));
        return text;
    }

    // Blocks are no objects a script highlights or selects: they are outlined alone.
    void Blocks() {
        const std::vector<Block>& blocks = m_plan ? m_plan->constraints.blocks : m_design.blocks;
        for (const Block& block : blocks) {
            const std::optional<Region> region = RegionOf(block);
            if (!region || !Meets(region->x0, region->y0, region->x1 + 1, region->y1 + 1)) continue;
            Add(SceneKind::Block, block.name,
                {double(region->x0), double(region->y0), double(region->x1 + 1), double(region->y1 + 1)}, "",
                "#2060c0", block.name, kLayerBlock);
        }
    }

    // Sites are drawn only when highlighted or selected.
    void Sites() {
        std::set<std::string> marked;
        for (std::string_view name : m_selected) marked.emplace(name);
        for (const auto& [name, colour] : m_state.highlight) marked.insert(name);
        for (const std::string& name : marked) {
            const std::optional<SiteRef> site = m_design.device.ParseSite(name);
            if (!site || !SiteMeets(*site)) continue;
            const std::string* colour = Highlight(name);
            Add(SceneKind::Site, name, {double(site->x), double(site->y), double(site->x + 1), double(site->y + 1)},
                colour ? *colour : "", Outline(name, "#707070"), "", kLayerProhibited);
        }
    }

    std::optional<SiteRef> PortSite(const IoPort& port) const {
        if (m_plan) {
            auto it = m_plan->constraints.ports.find(port.name);
            return it == m_plan->constraints.ports.end() ? std::nullopt : m_design.device.ParseSite(it->second);
        }
        return port.site.empty() ? std::nullopt : m_design.device.ParseSite(port.site);
    }

    void Ports() {
        for (const IoPort& port : m_design.ports) {
            const std::optional<SiteRef> site = PortSite(port);
            if (!site || !SiteMeets(*site)) continue;
            Add(SceneKind::Port, port.name,
                {site->x + kPortInset, site->y + kPortInset, site->x + 1 - kPortInset, site->y + 1 - kPortInset},
                Fill(port.name, port.output ? "#d06030" : "#30a040"), Outline(port.name, "#202020"), port.name,
                kLayerPort);
        }
    }

    // The centre of the site of a cell or port, when placed.
    std::optional<std::pair<double, double>> Centre(const std::string& name) const {
        std::optional<SiteRef> site;
        if (const Cell* cell = m_design.FindCell(name); cell && !cell->site.empty())
            site = m_design.device.ParseSite(cell->site);
        else if (const IoPort* port = m_design.FindPort(name))
            site = PortSite(*port);
        if (!site) return std::nullopt;
        return std::pair{site->x + 0.5, site->y + 0.5};
    }

    // Adds the points of the named objects that are placed; false when the line has no two points or
    // does not meet the rectangle.
    bool Line(const std::vector<const std::string*>& names, std::vector<double>& coords) const {
        double x0 = 1e300, y0 = 1e300, x1 = -1e300, y1 = -1e300;
        for (const std::string* name : names) {
            const auto point = Centre(*name);
            if (!point) continue;
            coords.push_back(point->first);
            coords.push_back(point->second);
            x0 = std::min(x0, point->first), x1 = std::max(x1, point->first);
            y0 = std::min(y0, point->second), y1 = std::max(y1, point->second);
        }
        return coords.size() >= 4 && Meets(x0, y0, x1 + 1e-9, y1 + 1e-9);
    }

    // Nets are fly-lines on request: the marked ones (highlighted or selected) in their colour, and
    // with NetLines::All the others too, as long as they stay within kFlyLineLimit lines; past it the
    // walk stops measuring them, and none of them is drawn.
    void Nets() {
        if (m_nets == NetLines::None) return;
        std::vector<SceneItem> plain;
        std::size_t lines = 0;
        for (const Net& net : m_design.nets) {
            const std::string* colour = Highlight(net.name);
            const bool marked = colour != nullptr || Selected(net.name);
            if (!marked && (m_nets != NetLines::All || lines > kFlyLineLimit)) continue;
            std::vector<const std::string*> ends{&net.driver};
            for (const std::string& load : net.loads) ends.push_back(&load);
            std::vector<double> coords;
            if (!Line(ends, coords)) continue;
            if (marked) {
                Add(SceneKind::Net, net.name, std::move(coords), "", colour ? *colour : kSelectionColor, net.name,
                    kLayerNet);
                continue;
            }
            lines += coords.size() / 2 - 1;
            plain.push_back(SceneItem{SceneKind::Net, net.name, std::move(coords), "", kFlyLineColor, net.name,
                                      kLayerNet});
        }
        m_scene.flyLinesLeftOut = lines > kFlyLineLimit;
        if (!m_scene.flyLinesLeftOut)
            m_scene.items.insert(m_scene.items.end(), std::make_move_iterator(plain.begin()),
                                 std::make_move_iterator(plain.end()));
    }

    void WorstPath() {
        const TimingData* timing = m_state.timing.get();
        if (timing == nullptr) return;
        auto it = timing->analyses.find(timing->lastRun);
        if (it == timing->analyses.end()) return;
        const std::optional<TimingResult>& result = it->second.result;
        if (!result || result->epoch != m_state.designEpoch || result->paths.empty()) return;
        const TimingPath& worst = result->paths.front();
        std::vector<const std::string*> points;
        for (const std::string& point : worst.points) points.push_back(&point);
        std::vector<double> coords;
        if (!Line(points, coords)) return;
        char slack[64];
        std::snprintf(slack, sizeof slack, "%.3f", worst.slack);
        Add(SceneKind::Path, "path." + it->first, std::move(coords), "", kPathColor,
            worst.startpoint + " -> " + worst.endpoint + " slack " + slack, kLayerPath);
    }

    const ToolState& m_state;
    const Design& m_design;
    const Viewport m_rect;
    const NetLines m_nets;
    const FloorplanData* m_plan = nullptr;
    std::set<std::string_view> m_selected;
    Scene m_scene;
};

}  // namespace

Scene BuildScene(const ToolState& state, const Viewport& rect, NetLines nets) {
    const Design* design = state.CurrentDesign();
    if (design == nullptr) return Scene{rect, 0, false, false, {}};
    return SceneMaker(state, *design, rect, nets).Make();
}

}  // namespace kelmartool
