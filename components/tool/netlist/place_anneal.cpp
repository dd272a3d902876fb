// Simulated annealing of the cells of a placed design over the logic sites of its device, to the
// least total half-perimeter wire length (HPWL) it finds. It starts from the cells shuffled over the
// logic sites by the seed; a move swaps a cell with the cell on another logic site or moves it to
// a free one, within a window that shrinks as fewer moves are accepted. Only the nets of the moved
// cells are measured again. Ports stay where they are; so every placement stays legal.
#include <algorithm>
#include <cmath>
#include <limits>
#include <unordered_map>

#include "netlist.h"
#include "seeded_random.h"

namespace kelmartool {

namespace {

// A net with more pins than this (a clock, a reset) spans the device whatever the annealing does;
// measuring it again on every move of one of its cells would cost more than it tells.
constexpr std::size_t kMaxAnnealPins = 64;
// Moves tried at one temperature, per cell; and the temperatures at most.
constexpr long long kMovesPerCell = 8;
constexpr int kMaxTemperatures = 150;


class Annealer {
public:
    Annealer(Design& design, std::uint64_t seed) : design_(design), state_(seed ^ 0x5DEECE66Dull) {}

    std::string Run(long long& start, long long& placed);

private:
    struct Point {
        int x = 0, y = 0;
    };
    int Span(std::size_t net) const;
    long long Total() const;
    // The change of wire length over the annealed nets of cells `a` and `b` (none when it is
    // `cells_`) between their spans kept and where `at_` now has the cells.
    long long Delta(std::size_t a, std::size_t b);
    void Commit();
    bool TryMove(double temperature, int window);

    Design& design_;
    std::uint64_t state_;
    int columns_ = 0, rows_ = 0;
    std::size_t cells_ = 0;
    // The moves read these at random places: flat arrays of 32-bit indexes, each list of a net or a
    // cell a run of one array, keep what one move touches in a few cache lines.
    std::vector<Point> at_;                  // cells, then ports
    std::vector<std::uint32_t> pinsFrom_;    // net -> its first object in pins_; one more at the end
    std::vector<std::uint32_t> pins_;        // the objects of every net, net after net
    std::vector<bool> annealed_;             // nets measured during the annealing
    std::vector<std::uint32_t> netsFrom_;    // cell -> its first annealed net in nets_; one more at the end
    std::vector<std::uint32_t> nets_;        // the annealed nets of every cell, cell after cell
    std::vector<int> span_;                     // net -> HPWL at the current placement
    std::vector<int> occupant_;                 // logic site -> cell, -1 free
    std::vector<unsigned> stamp_;
    unsigned epoch_ = 0;
    long long cost_ = 0;        // the wire length of the annealed nets
    long long lastDelta_ = 0;   // of the last move tried
    std::vector<std::pair<std::size_t, int>> changed_;  // nets and their new spans of the last Delta

    std::size_t SiteIndex(int x, int y) const {
        return static_cast<std::size_t>(y - 1) * static_cast<std::size_t>(columns_ - 2) + static_cast<std::size_t>(x - 1);
    }
};

int Annealer::Span(std::size_t net) const {
    int x0 = std::numeric_limits<int>::max(), y0 = x0, x1 = -1, y1 = -1;
    for (std::uint32_t i = pinsFrom_[net], end = pinsFrom_[net + 1]; i < end; ++i) {
        const Point& p = at_[pins_[i]];
        x0 = std::min(x0, p.x), x1 = std::max(x1, p.x);
        y0 = std::min(y0, p.y), y1 = std::max(y1, p.y);
    }
    return x1 < 0 ? 0 : (x1 - x0) + (y1 - y0);
}

long long Annealer::Total() const {
    long long total = 0;
    for (std::size_t n = 0; n + 1 < pinsFrom_.size(); ++n) total += Span(n);
    return total;
}

long long Annealer::Delta(std::size_t a, std::size_t b) {
    if (++epoch_ == 0) {
        std::fill(stamp_.begin(), stamp_.end(), 0u);
        epoch_ = 1;
    }
    changed_.clear();
    long long delta = 0;
    const auto measure = [&](std::size_t cell) {
        for (std::uint32_t i = netsFrom_[cell], end = netsFrom_[cell + 1]; i < end; ++i) {
            const std::uint32_t n = nets_[i];
            if (stamp_[n] == epoch_) continue;
            stamp_[n] = epoch_;
            const int span = Span(n);
            delta += span - span_[n];
            changed_.emplace_back(n, span);
        }
    };
    measure(a);
    if (b < cells_) measure(b);
    return delta;
}

void Annealer::Commit() {
    for (const auto& [net, span] : changed_) span_[net] = span;
    cost_ += lastDelta_;
}

// One move of a random cell to a random logic site within `window` of it: accepted when it
// shortens the wire length, or by the Metropolis rule at `temperature`.
bool Annealer::TryMove(double temperature, int window) {
    const std::size_t a = NextRandom(state_) % cells_;
    const Point from = at_[a];
    const int x0 = std::max(1, from.x - window), x1 = std::min(columns_ - 2, from.x + window);
    const int y0 = std::max(1, from.y - window), y1 = std::min(rows_ - 2, from.y + window);
    const Point to{x0 + static_cast<int>(NextRandom(state_) % static_cast<std::uint64_t>(x1 - x0 + 1)),
                   y0 + static_cast<int>(NextRandom(state_) % static_cast<std::uint64_t>(y1 - y0 + 1))};
    lastDelta_ = 0;
    if (to.x == from.x && to.y == from.y) return false;
    const int other = occupant_[SiteIndex(to.x, to.y)];
    const std::size_t b = other < 0 ? cells_ : static_cast<std::size_t>(other);
    at_[a] = to;
    if (b < cells_) at_[b] = from;
    const long long delta = lastDelta_ = Delta(a, b);
    if (delta <= 0 || (temperature > 0 && NextUnit(state_) < std::exp(-static_cast<double>(delta) / temperature))) {
        Commit();
        occupant_[SiteIndex(to.x, to.y)] = static_cast<int>(a);
        occupant_[SiteIndex(from.x, from.y)] = other;
        return true;
    }
    at_[a] = from;
    if (b < cells_) at_[b] = to;
    return false;
}

std::string Annealer::Run(long long& start, long long& placed) {
    columns_ = design_.device.columns;
    rows_ = design_.device.rows;
    cells_ = design_.cells.size();
    const std::size_t ports = design_.ports.size();
    if (columns_ < 3 || rows_ < 3) return "the device has no logic sites";
    const std::size_t logic = static_cast<std::size_t>(columns_ - 2) * static_cast<std::size_t>(rows_ - 2);
    if (logic < cells_) return "the device has fewer logic sites than the design has cells";

    std::unordered_map<std::string_view, std::size_t> index;
    for (std::size_t i = 0; i < cells_; ++i) index.emplace(design_.cells[i].name, i);
    at_.assign(cells_ + ports, Point{});
    for (std::size_t i = 0; i < ports; ++i) {
        const IoPort& port = design_.ports[i];
        const auto site = design_.device.ParseSite(port.site);
        if (!site) return "the port " + port.name + " has no site on the device";
        at_[cells_ + i] = Point{site->x, site->y};
        index.emplace(port.name, cells_ + i);
    }

    // The random legal placement the annealing starts from: the cells shuffled over the logic sites.
    std::vector<std::size_t> sites(logic);
    for (std::size_t s = 0; s < logic; ++s) sites[s] = s;
    for (std::size_t i = logic; i > 1; --i) std::swap(sites[i - 1], sites[NextRandom(state_) % i]);
    occupant_.assign(logic, -1);
    const auto width = static_cast<std::size_t>(columns_ - 2);
    for (std::size_t c = 0; c < cells_; ++c) {
        at_[c] = Point{static_cast<int>(sites[c] % width) + 1, static_cast<int>(sites[c] / width) + 1};
        occupant_[sites[c]] = static_cast<int>(c);
    }

    const std::size_t netCount = design_.nets.size();
    pinsFrom_.assign(1, 0);
    pins_.clear();
    annealed_.assign(netCount, false);
    std::vector<std::uint32_t> cellNets(cells_ + 1, 0);  // annealed nets per cell, then where they start
    for (std::size_t n = 0; n < netCount; ++n) {
        const Net& net = design_.nets[n];
        const std::size_t first = pins_.size();
        const auto add = [&](const std::string& name) {
            if (const auto it = index.find(name); it != index.end()) pins_.push_back(static_cast<std::uint32_t>(it->second));
        };
        add(net.driver);
        for (const std::string& load : net.loads) add(load);
        const auto begin = pins_.begin() + static_cast<std::ptrdiff_t>(first);
        std::sort(begin, pins_.end());
        pins_.erase(std::unique(begin, pins_.end()), pins_.end());
        pinsFrom_.push_back(static_cast<std::uint32_t>(pins_.size()));
        const std::size_t count = pins_.size() - first;
        if (count < 2 || count > kMaxAnnealPins) continue;
        annealed_[n] = true;
        for (std::size_t i = first; i < pins_.size(); ++i)
            if (pins_[i] < cells_) ++cellNets[pins_[i] + 1];
    }
    for (std::size_t c = 0; c < cells_; ++c) cellNets[c + 1] += cellNets[c];
    netsFrom_ = cellNets;
    nets_.assign(cellNets.back(), 0);
    for (std::size_t n = 0; n < netCount; ++n) {
        if (!annealed_[n]) continue;
        for (std::uint32_t i = pinsFrom_[n]; i < pinsFrom_[n + 1]; ++i)
            if (pins_[i] < cells_) nets_[cellNets[pins_[i]]++] = static_cast<std::uint32_t>(n);
    }
    span_.assign(netCount, 0);
    for (std::size_t n = 0; n < netCount; ++n) {
        span_[n] = Span(n);
        if (annealed_[n]) cost_ += span_[n];
    }
    stamp_.assign(netCount, 0u);
    start = Total();

    if (cells_ >= 2 || (cells_ == 1 && logic > 1)) {
        // The first temperature: twenty times the spread of the changes of random moves.
        const long long moves = std::max(100LL, kMovesPerCell * static_cast<long long>(cells_));
        const int largest = std::max(columns_, rows_);
        double sum = 0, square = 0;
        const long long probes = std::min<long long>(moves, 2000);
        for (long long i = 0; i < probes; ++i) {
            TryMove(std::numeric_limits<double>::infinity(), largest);
            const auto change = static_cast<double>(lastDelta_);
            sum += change, square += change * change;
        }
        const double mean = sum / static_cast<double>(probes);
        double temperature = 20.0 * std::sqrt(std::max(0.0, square / static_cast<double>(probes) - mean * mean));
        double window = largest;
        const double nets = static_cast<double>(std::max<long long>(1, std::count(annealed_.begin(), annealed_.end(), true)));
        for (int step = 0; step < kMaxTemperatures; ++step) {
            long long accepted = 0;
            for (long long i = 0; i < moves; ++i) accepted += TryMove(temperature, static_cast<int>(window)) ? 1 : 0;
            const double rate = static_cast<double>(accepted) / static_cast<double>(moves);
            if (temperature < 0.005 * static_cast<double>(cost_) / nets || temperature == 0) break;
            // Cool fast while nearly everything is accepted or nearly nothing; slowly in between.
            temperature *= rate > 0.96 ? 0.5 : rate > 0.8 ? 0.9 : rate > 0.15 ? 0.95 : 0.8;
            // A window in which about 44% of the moves are accepted.
            window = std::clamp(window * (1.0 - 0.44 + rate), 1.0, static_cast<double>(largest));
        }
        // A last pass that takes only improvements.
        for (long long i = 0; i < moves; ++i) TryMove(0, 1);
    }
    for (std::size_t c = 0; c < cells_; ++c) design_.cells[c].site = Device::SiteName(at_[c].x, at_[c].y);
    placed = Total();
    return {};
}

}  // namespace

std::string PlaceAnneal(Design& design, std::uint64_t seed, long long& start, long long& placed) {
    start = placed = 0;
    return Annealer(design, seed).Run(start, placed);
}

}  // namespace kelmartool
