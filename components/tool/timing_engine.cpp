// The timing engine: arrival times from every start point through the combinational netlist, required
// times at the endpoints, slacks, the worst paths and the high-fanout nets.
#include <algorithm>
#include <cmath>
#include <functional>
#include <limits>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <string_view>
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

// Where paths may start ("from") or end ("to"): every name, or by the rule of that side "only" the
// names it lists or all "except" them.
class EndpointRule {
public:
    EndpointRule(const TimingSettings& settings, const char* side) {
        const auto it = settings.endpoints.find(side);
        if (it == settings.endpoints.end()) return;
        m_only = it->second.side == "only";
        m_ruled = true;
        m_items.insert(it->second.items.begin(), it->second.items.end());
    }
    bool Allows(const std::string& name) const { return !m_ruled || (m_items.count(name) != 0) == m_only; }

private:
    bool m_ruled = false;
    bool m_only = false;
    std::set<std::string_view> m_items;
};

// Arrival times from one start point at a time. A sweep visits the start's fan-out cone alone: the
// combinational cells it reaches are taken by their place in `order` (a heap of places), the order a
// walk over every cell would take them in, so that of two feeders with the same arrival the same one
// wins. What one sweep set is cleared by the next, so that a sweep costs its cone, not the design.
class Sweep {
public:
    Sweep(const Graph& graph, const std::vector<std::size_t>& order, const std::vector<char>& isEnd)
        : m_graph(graph), m_order(order), m_isEnd(isEnd) {
        const std::size_t size = graph.Size();
        m_place.assign(size, 0);
        for (std::size_t i = 0; i < order.size(); ++i) m_place[order[i]] = i;
        m_arrival.assign(size, kUnreached);
        m_inArrival.assign(size, kUnreached);
        m_endArrival.assign(size, kUnreached);
        m_feeder.assign(size, 0);
        m_endFeeder.assign(size, 0);
    }

    // Times every path from `start`, launched at `launch`; Ends() then holds the endpoints reached.
    void From(std::size_t start, double launch) {
        for (std::size_t n : m_reached) m_inArrival[n] = kUnreached;
        for (std::size_t n : m_ends) m_endArrival[n] = kUnreached;
        m_reached.clear();
        m_ends.clear();
        m_start = start;
        m_arrival[start] = launch;
        Spread(start);
        while (!m_heap.empty()) {
            std::pop_heap(m_heap.begin(), m_heap.end(), std::greater<>());
            const std::size_t n = m_order[m_heap.back()];
            m_heap.pop_back();
            m_arrival[n] = m_inArrival[n] + m_graph.CellAt(n).delay;
            Spread(n);
        }
    }

    std::size_t Start() const noexcept { return m_start; }
    const std::vector<std::size_t>& Ends() const noexcept { return m_ends; }
    double EndArrival(std::size_t end) const { return m_endArrival[end]; }

    // The latest path of the last sweep to `end`: the start, the cells passed, the end.
    std::vector<std::string> Points(std::size_t end) const {
        std::vector<std::string> points{m_graph.Name(end)};
        for (std::size_t at = m_endFeeder[end]; at != m_start; at = m_feeder[at]) points.push_back(m_graph.Name(at));
        points.push_back(m_graph.Name(m_start));
        std::reverse(points.begin(), points.end());
        return points;
    }

private:
    void Spread(std::size_t from) {
        for (const Edge& e : m_graph.Out(from)) {
            const double at = m_arrival[from] + e.delay;
            if (m_graph.Through(e.to) && at > m_inArrival[e.to]) {
                if (m_inArrival[e.to] == kUnreached) {
                    m_reached.push_back(e.to);
                    m_heap.push_back(m_place[e.to]);
                    std::push_heap(m_heap.begin(), m_heap.end(), std::greater<>());
                }
                m_inArrival[e.to] = at;
                m_feeder[e.to] = from;
            }
            if (m_isEnd[e.to] && at > m_endArrival[e.to]) {
                if (m_endArrival[e.to] == kUnreached) m_ends.push_back(e.to);
                m_endArrival[e.to] = at;
                m_endFeeder[e.to] = from;
            }
        }
    }

    const Graph& m_graph;
    const std::vector<std::size_t>& m_order;
    const std::vector<char>& m_isEnd;
    std::vector<std::size_t> m_place;  // node -> its place in the order
    std::vector<double> m_arrival, m_inArrival, m_endArrival;
    std::vector<std::size_t> m_feeder, m_endFeeder;
    std::vector<std::size_t> m_reached, m_ends;  // what the last sweep set
    std::vector<std::size_t> m_heap;              // places of the cells reached and not yet passed
    std::size_t m_start = 0;
};

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
    const EndpointRule from(settings, "from"), to(settings, "to");
    const auto isStart = [&](std::size_t n) {
        if (!graph.Active(n) || !from.Allows(graph.Name(n))) return false;
        return graph.IsCell(n) ? graph.CellAt(n).sequential : !graph.PortAt(n).output;
    };
    auto portDelay = [&](const std::string& port, double general) {
        auto it = constraints.portDelays.find(port);
        return it == constraints.portDelays.end() ? general : it->second;
    };
    // Every endpoint with its capturing clock and required time; none when no clock times it.
    struct Required {
        const std::string* clock;
        double time;
    };
    std::vector<char> isEnd(size, 0);
    std::vector<std::optional<Required>> required(size);
    for (std::size_t n = 0; n < size; ++n) {
        if (!graph.Active(n) || !to.Allows(graph.Name(n))) continue;
        if (graph.IsCell(n)) {
            const Cell& c = graph.CellAt(n);
            if (!c.sequential) continue;
            isEnd[n] = 1;
            if (auto it = constraints.periods.find(c.clock); it != constraints.periods.end())
                required[n] = Required{&c.clock, it->second - c.setup - constraints.uncertainty};
            continue;
        }
        if (!graph.PortAt(n).output) continue;
        isEnd[n] = 1;
        const std::string& ref = constraints.referenceClock;
        if (ref.empty() || graph.ClockOff(ref)) continue;
        required[n] = Required{&ref, constraints.periods[ref] - portDelay(graph.Name(n), constraints.outputDelay) -
                                         constraints.uncertainty};
    }
    const auto launch = [&](std::size_t start) {
        return graph.IsCell(start) ? graph.CellAt(start).delay : portDelay(graph.Name(start), constraints.inputDelay);
    };

    // Every start point on its own, so that each endpoint learns its latest arrival from every start.
    struct Reach {
        std::size_t end, start;
        double arrival, slack;
    };
    std::vector<Reach> reaches;
    std::vector<char> unconstrained(size, 0);
    Sweep sweep(graph, order, isEnd);
    for (std::size_t start = 0; start < size; ++start) {
        if (!isStart(start)) continue;
        if (!graph.IsCell(start) && (constraints.referenceClock.empty() || graph.ClockOff(constraints.referenceClock)))
            continue;  // an input without a clock to launch it
        sweep.From(start, launch(start));
        for (std::size_t end : sweep.Ends()) {
            if (!required[end]) {
                unconstrained[end] = 1;
                continue;
            }
            const double arrival = sweep.EndArrival(end);
            reaches.push_back({end, start, arrival, RoundTime(required[end]->time - arrival)});
        }
    }
    // By endpoint, each endpoint's paths worst first.
    std::sort(reaches.begin(), reaches.end(), [&graph](const Reach& a, const Reach& b) {
        if (a.end != b.end) return a.end < b.end;
        if (a.slack != b.slack) return a.slack < b.slack;
        return graph.Name(a.start) < graph.Name(b.start);
    });

    TimingResult result;
    result.design = design.name;
    auto query = [&settings](const char* kind) -> const TimingSettings::Query* {
        auto it = settings.queries.find(kind);
        return it == settings.queries.end() ? nullptr : &it->second;
    };
    const TimingSettings::Query* pathQuery = query("paths");
    const std::size_t perEndpoint = pathQuery && pathQuery->hf > 0 ? static_cast<std::size_t>(pathQuery->hf) : 1;
    const int limit = pathQuery && pathQuery->ld > 0 ? pathQuery->ld : pathLimit;
    std::vector<const Reach*> candidates;  // the worst paths of every endpoint
    for (std::size_t first = 0, next = 0; first < reaches.size(); first = next) {
        while (next < reaches.size() && reaches[next].end == reaches[first].end) ++next;
        ++result.endpoints;
        const double worst = reaches[first].slack;
        if (!result.worstSlack || worst < *result.worstSlack) result.worstSlack = worst;
        if (worst < 0) {
            ++result.failing;
            result.totalNegativeSlack = RoundTime(result.totalNegativeSlack + worst);
        }
        for (std::size_t i = first; i < next && i - first < perEndpoint; ++i) candidates.push_back(&reaches[i]);
    }
    std::sort(candidates.begin(), candidates.end(), [&graph](const Reach* a, const Reach* b) {
        if (a->slack != b->slack) return a->slack < b->slack;
        if (a->end != b->end) return graph.Name(a->end) < graph.Name(b->end);
        return graph.Name(a->start) < graph.Name(b->start);
    });
    // Worst first, the paths the filters pass until the limit has them: only these are traced
    // again for the cells they pass.
    bool swept = false;
    for (const Reach* reach : candidates) {
        if (limit > 0 && result.paths.size() >= static_cast<std::size_t>(limit)) break;
        if (!swept || sweep.Start() != reach->start) sweep.From(reach->start, launch(reach->start));
        swept = true;
        TimingPath path;
        path.startpoint = graph.Name(reach->start);
        path.endpoint = graph.Name(reach->end);
        path.clock = *required[reach->end]->clock;
        path.arrival = RoundTime(reach->arrival);
        path.required = RoundTime(required[reach->end]->time);
        path.slack = reach->slack;
        path.points = sweep.Points(reach->end);
        if (PassesFilters(settings, path)) result.paths.push_back(std::move(path));
    }
    for (std::size_t n = 0; n < size; ++n) result.unconstrained += unconstrained[n];

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
