// The timing engine: arrival times from every start point through the combinational netlist, required
// times at the endpoints, slacks, the worst paths and the high-fanout nets.
#include <algorithm>
#include <cmath>
#include <limits>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include <tcl.h>

#include "timing_model.h"

namespace kelmartool {

double RoundTime(double value) noexcept { return std::round(value * 1e6) / 1e6; }

namespace {

constexpr double kUnreached = -std::numeric_limits<double>::infinity();

struct Edge {
    std::size_t to;
    double delay;
};

bool MatchesAny(const std::string& name, const std::vector<std::string>& patterns) {
    for (const std::string& p : patterns)
        if (Tcl_StringMatch(name.c_str(), p.c_str())) return true;
    return false;
}

// The constraints of a run, resolved against the design.
struct Resolved {
    std::map<std::string, double> periods;  // by clock
    std::string referenceClock;
    double inputDelay = 0;
    double outputDelay = 0;
    std::map<std::string, double> portDelays;  // by port, input or output
    double uncertainty = 0;
};

bool Resolve(const Design& design, const TimingSettings& settings, Resolved& r, std::string& error) {
    for (const Clock& c : design.clocks) r.periods[c.name] = c.period;
    if (!design.clocks.empty()) r.referenceClock = design.clocks.front().name;
    for (const auto& [name, constraint] : settings.constraints) {
        if (!constraint.enabled) continue;
        const auto colon = name.find(':');
        const std::string type = name.substr(0, colon);
        const std::string object = colon == std::string::npos ? std::string() : name.substr(colon + 1);
        // The values were checked when they were set; the objects may have gone since.
        const double number = std::strtod(constraint.value.c_str(), nullptr);
        if (type == "period") {
            if (!design.FindClock(object)) {
                error = "constraint '" + name + "' names no clock of the design";
                return false;
            }
            r.periods[object] = number;
        } else if (type == "reference_clock") {
            if (!design.FindClock(constraint.value)) {
                error = "constraint '" + name + "' names no clock of the design";
                return false;
            }
            r.referenceClock = constraint.value;
        } else if (type == "uncertainty") {
            r.uncertainty = number;
        } else if (object.empty()) {
            (type == "input_delay" ? r.inputDelay : r.outputDelay) = number;
        } else {
            if (!design.FindPort(object)) {
                error = "constraint '" + name + "' names no port of the design";
                return false;
            }
            r.portDelays[object] = number;
        }
    }
    return true;
}

// The netlist as a graph of cells and ports. Nets driven by a clock carry no data: their loads are
// clock pins. Disabled nets carry nothing either.
class Graph {
public:
    Graph(const Design& design, const TimingSettings& settings) : m_design(design) {
        const std::size_t cells = design.cells.size();
        m_size = cells + design.ports.size();
        m_out.resize(m_size);
        m_in.resize(m_size);
        auto disabled = [&settings](const char* kind) {
            auto it = settings.disabled.find(kind);
            return it == settings.disabled.end() ? std::set<std::string>{} : it->second;
        };
        std::set<std::string> skipped = disabled("net");
        for (const Clock& c : design.clocks)
            if (!c.net.empty()) skipped.insert(c.net);
        for (const Net& net : design.nets) {
            if (skipped.count(net.name)) continue;
            const auto from = Node(net.driver);
            if (!from) continue;
            for (const std::string& load : net.loads)
                if (const auto to = Node(load)) {
                    m_out[*from].push_back({*to, net.delay});
                    m_in[*to].push_back({*from, net.delay});
                }
        }
        const auto offCells = disabled("cell");
        const auto offPorts = disabled("port");
        const auto offClocks = disabled("clock");
        m_active.assign(m_size, true);
        for (std::size_t i = 0; i < cells; ++i) {
            const Cell& c = design.cells[i];
            m_active[i] = !offCells.count(c.name) && !(c.sequential && offClocks.count(c.clock));
        }
        for (std::size_t i = 0; i < design.ports.size(); ++i)
            m_active[cells + i] = !offPorts.count(design.ports[i].name);
        m_offClocks = offClocks;
    }

    std::size_t Size() const noexcept { return m_size; }
    const std::vector<Edge>& Out(std::size_t n) const { return m_out[n]; }
    bool Active(std::size_t n) const { return m_active[n]; }
    bool ClockOff(const std::string& clock) const { return m_offClocks.count(clock) != 0; }

    bool IsCell(std::size_t n) const noexcept { return n < m_design.cells.size(); }
    const Cell& CellAt(std::size_t n) const { return m_design.cells[n]; }
    const IoPort& PortAt(std::size_t n) const { return m_design.ports[n - m_design.cells.size()]; }
    const std::string& Name(std::size_t n) const { return IsCell(n) ? CellAt(n).name : PortAt(n).name; }
    // A combinational cell that paths pass through.
    bool Through(std::size_t n) const { return IsCell(n) && !CellAt(n).sequential && m_active[n]; }

    // The combinational cells in an order where every cell comes after the cells that feed it. False
    // with `loop` holding one loop, in the direction of the signal, when there is none.
    bool Order(std::vector<std::size_t>& order, std::vector<std::string>& loop) const {
        std::vector<int> pending(m_size, 0);
        for (std::size_t n = 0; n < m_size; ++n)
            if (Through(n))
                for (const Edge& e : m_out[n])
                    if (Through(e.to)) ++pending[e.to];
        std::vector<std::size_t> ready;
        for (std::size_t n = 0; n < m_size; ++n)
            if (Through(n) && pending[n] == 0) ready.push_back(n);
        while (!ready.empty()) {
            const std::size_t n = ready.back();
            ready.pop_back();
            order.push_back(n);
            for (const Edge& e : m_out[n])
                if (Through(e.to) && --pending[e.to] == 0) ready.push_back(e.to);
        }
        std::size_t through = 0;
        for (std::size_t n = 0; n < m_size; ++n) through += Through(n) ? 1 : 0;
        if (order.size() == through) return true;
        loop = FindLoop(pending);
        return false;
    }

private:
    std::optional<std::size_t> Node(const std::string& name) const {
        const auto ref = m_design.Find(name);
        if (!ref) return std::nullopt;
        if (ref->kind == Kind::Cell) return ref->index;
        if (ref->kind == Kind::Port) return m_design.cells.size() + ref->index;
        return std::nullopt;
    }

    // Every cell left pending is fed by another pending cell, so walking back from one along pending
    // feeders must come round; the walk always takes the feeder of the smallest name, so the answer
    // is the same on every run.
    std::vector<std::string> FindLoop(const std::vector<int>& pending) const {
        auto left = [&](std::size_t n) { return Through(n) && pending[n] > 0; };
        std::optional<std::size_t> start;
        for (std::size_t n = 0; n < m_size; ++n)
            if (left(n) && (!start || Name(n) < Name(*start))) start = n;
        std::vector<std::size_t> walk;
        std::map<std::size_t, std::size_t> seen;
        std::size_t at = *start;
        while (!seen.count(at)) {
            seen[at] = walk.size();
            walk.push_back(at);
            std::optional<std::size_t> feeder;
            for (const Edge& e : m_in[at])
                if (left(e.to) && (!feeder || Name(e.to) < Name(*feeder))) feeder = e.to;
            at = *feeder;
        }
        // The walk went against the signal; the loop is its tail from the first repeat, reversed.
        std::vector<std::size_t> cycle(walk.begin() + static_cast<std::ptrdiff_t>(seen[at]), walk.end());
        std::reverse(cycle.begin(), cycle.end());
        const auto first = std::min_element(cycle.begin(), cycle.end(),
                                            [this](std::size_t a, std::size_t b) { return Name(a) < Name(b); });
        std::rotate(cycle.begin(), first, cycle.end());
        std::vector<std::string> names;
        for (std::size_t n : cycle) names.push_back(Name(n));
        return names;
    }

    const Design& m_design;
    std::size_t m_size = 0;
    std::vector<std::vector<Edge>> m_out;
    std::vector<std::vector<Edge>> m_in;  // `to` is the feeder here
    std::vector<bool> m_active;
    std::set<std::string> m_offClocks;
};

bool Allowed(const TimingSettings& settings, const char* kind, const std::string& name) {
    auto it = settings.endpoints.find(kind);
    if (it == settings.endpoints.end()) return true;
    const bool listed = std::find(it->second.items.begin(), it->second.items.end(), name) != it->second.items.end();
    return it->second.side == "only" ? listed : !listed;
}

bool PassesFilters(const TimingSettings& settings, const TimingPath& path) {
    for (const auto& [kind, filter] : settings.filters) {
        bool keep = true;
        if (kind == "slack") {
            const double bound = std::strtod(filter.items.front().c_str(), nullptr);
            keep = filter.mode == "below" ? path.slack < bound : path.slack > bound;
        } else {
            bool hit = false;
            if (kind == "through") {
                for (const std::string& point : path.points) hit = hit || MatchesAny(point, filter.items);
            } else {
                const std::string& name = kind == "startpoint" ? path.startpoint
                                          : kind == "endpoint" ? path.endpoint
                                                               : path.clock;
                hit = MatchesAny(name, filter.items);
            }
            keep = filter.mode == "include" ? hit : !hit;
        }
        if (!keep) return false;
    }
    return true;
}

bool WorseFirst(const TimingPath& a, const TimingPath& b) {
    if (a.slack != b.slack) return a.slack < b.slack;
    if (a.endpoint != b.endpoint) return a.endpoint < b.endpoint;
    return a.startpoint < b.startpoint;
}

}  // namespace

bool RunTiming(const Design& design, const TimingSettings& settings, int pathLimit, TimingResult& out,
               std::string& error) {
    Resolved constraints;
    if (!Resolve(design, settings, constraints, error)) return false;
    const Graph graph(design, settings);
    std::vector<std::size_t> order;
    std::vector<std::string> loop;
    if (!graph.Order(order, loop)) {
        error = "combinational loop:";
        for (const std::string& name : loop) error += " " + name + " ->";
        error += " " + loop.front();
        return false;
    }

    const std::size_t size = graph.Size();
    auto isStart = [&](std::size_t n) {
        if (!graph.Active(n) || !Allowed(settings, "from", graph.Name(n))) return false;
        return graph.IsCell(n) ? graph.CellAt(n).sequential : !graph.PortAt(n).output;
    };
    auto isEnd = [&](std::size_t n) {
        if (!graph.Active(n) || !Allowed(settings, "to", graph.Name(n))) return false;
        return graph.IsCell(n) ? graph.CellAt(n).sequential : graph.PortAt(n).output;
    };
    auto portDelay = [&](const std::string& port, double general) {
        auto it = constraints.portDelays.find(port);
        return it == constraints.portDelays.end() ? general : it->second;
    };
    // The capturing clock and required time of an endpoint; nothing when no clock times it.
    auto required = [&](std::size_t n) -> std::optional<std::pair<std::string, double>> {
        if (graph.IsCell(n)) {
            const Cell& c = graph.CellAt(n);
            auto it = constraints.periods.find(c.clock);
            if (it == constraints.periods.end()) return std::nullopt;
            return std::make_pair(c.clock, it->second - c.setup - constraints.uncertainty);
        }
        const std::string& ref = constraints.referenceClock;
        if (ref.empty() || graph.ClockOff(ref)) return std::nullopt;
        return std::make_pair(ref, constraints.periods[ref] - portDelay(graph.Name(n), constraints.outputDelay) -
                                       constraints.uncertainty);
    };

    // Every start point on its own, so that each endpoint learns its worst path from every start.
    std::map<std::size_t, std::vector<TimingPath>> byEndpoint;
    std::set<std::size_t> unconstrained;
    std::vector<double> arrival(size), inArrival(size), endArrival(size);
    std::vector<std::size_t> feeder(size), endFeeder(size);
    for (std::size_t start = 0; start < size; ++start) {
        if (!isStart(start)) continue;
        if (!graph.IsCell(start) && (constraints.referenceClock.empty() || graph.ClockOff(constraints.referenceClock)))
            continue;  // an input without a clock to launch it
        std::fill(inArrival.begin(), inArrival.end(), kUnreached);
        std::fill(endArrival.begin(), endArrival.end(), kUnreached);
        std::fill(arrival.begin(), arrival.end(), kUnreached);
        arrival[start] =
            graph.IsCell(start) ? graph.CellAt(start).delay : portDelay(graph.Name(start), constraints.inputDelay);
        auto spread = [&](std::size_t from) {
            for (const Edge& e : graph.Out(from)) {
                const double at = arrival[from] + e.delay;
                if (graph.Through(e.to) && at > inArrival[e.to]) {
                    inArrival[e.to] = at;
                    feeder[e.to] = from;
                }
                if (isEnd(e.to) && at > endArrival[e.to]) {
                    endArrival[e.to] = at;
                    endFeeder[e.to] = from;
                }
            }
        };
        spread(start);
        for (std::size_t n : order) {
            if (inArrival[n] == kUnreached) continue;
            arrival[n] = inArrival[n] + graph.CellAt(n).delay;
            spread(n);
        }
        for (std::size_t end = 0; end < size; ++end) {
            if (endArrival[end] == kUnreached) continue;
            const auto req = required(end);
            if (!req) {
                unconstrained.insert(end);
                continue;
            }
            TimingPath path;
            path.startpoint = graph.Name(start);
            path.endpoint = graph.Name(end);
            path.clock = req->first;
            path.arrival = RoundTime(endArrival[end]);
            path.required = RoundTime(req->second);
            path.slack = RoundTime(req->second - endArrival[end]);
            path.points.push_back(path.endpoint);
            for (std::size_t at = endFeeder[end]; at != start; at = feeder[at]) path.points.push_back(graph.Name(at));
            path.points.push_back(path.startpoint);
            std::reverse(path.points.begin(), path.points.end());
            byEndpoint[end].push_back(std::move(path));
        }
    }

    TimingResult result;
    result.design = design.name;
    auto query = [&settings](const char* kind) -> const TimingSettings::Query* {
        auto it = settings.queries.find(kind);
        return it == settings.queries.end() ? nullptr : &it->second;
    };
    const TimingSettings::Query* pathQuery = query("paths");
    const std::size_t perEndpoint = pathQuery && pathQuery->hf > 0 ? static_cast<std::size_t>(pathQuery->hf) : 1;
    const int limit = pathQuery && pathQuery->ld > 0 ? pathQuery->ld : pathLimit;
    for (auto& [end, paths] : byEndpoint) {
        std::sort(paths.begin(), paths.end(), WorseFirst);
        ++result.endpoints;
        const double worst = paths.front().slack;
        if (!result.worstSlack || worst < *result.worstSlack) result.worstSlack = worst;
        if (worst < 0) {
            ++result.failing;
            result.totalNegativeSlack = RoundTime(result.totalNegativeSlack + worst);
        }
        for (std::size_t i = 0; i < paths.size() && i < perEndpoint; ++i)
            if (PassesFilters(settings, paths[i])) result.paths.push_back(paths[i]);
    }
    std::sort(result.paths.begin(), result.paths.end(), WorseFirst);
    if (limit > 0 && result.paths.size() > static_cast<std::size_t>(limit))
        result.paths.resize(static_cast<std::size_t>(limit));
    for (std::size_t end : unconstrained)
        if (!byEndpoint.count(end)) ++result.unconstrained;

    if (const TimingSettings::Query* fanout = query("fanout")) {
        for (const Net& net : design.nets)
            if (static_cast<int>(net.loads.size()) >= fanout->hf && MatchesAny(net.name, fanout->items))
                result.highFanout.push_back({net.name, static_cast<int>(net.loads.size())});
        std::stable_sort(result.highFanout.begin(), result.highFanout.end(),
                         [](const FanoutNet& a, const FanoutNet& b) { return a.fanout > b.fanout; });
        if (fanout->ld > 0 && result.highFanout.size() > static_cast<std::size_t>(fanout->ld))
            result.highFanout.resize(static_cast<std::size_t>(fanout->ld));
    }
    out = std::move(result);
    return true;
}

}  // namespace kelmartool
