// Netlist import: the JSON netlist a synthesis tool writes (`write_json`: modules with ports, cells
// and netnames over numbered bits) turned into a placed design of the tool's model. Plain C++ over
// the model, no Tcl.
#pragma once

#include <cstdint>
#include <map>
#include <memory>
#include <optional>
#include <string>

#include "delay_library.h"
#include "design.h"

namespace kelmartool {

struct NetlistOptions {
    std::string top;                       // the top module; empty: the one marked "top"
    std::map<std::string, double> clocks;  // net or port name -> period in ns
    int columns = 0, rows = 0;             // the device; 0: sized to the design
    double utilization = 0.7;              // the share of logic sites a sized device fills, at most
    std::uint64_t seed = 1;
    DelayLibrary library;                  // the delays of cells and nets
};

// The period of a clock found on the flip-flops' clock pins that no option names.
inline constexpr double kDefaultClockPeriod = 10.0;

// Reads `text`, the content of `file`, into a placed design. Null with `error` saying where and why
// (the file, the path in the JSON, the reason) when the netlist cannot be imported.
std::unique_ptr<Design> ImportNetlist(const std::string& file, const std::string& text, const NetlistOptions& options,
                                      std::string& error);

// Places the ports of `design` on the edge of its device and its cells on the logic sites inside,
// one a site, in the order of their distance from the inputs, then anneals the cells (PlaceAnneal);
// the seed orders the cells of one level and seeds the annealing. The device is sized to the
// design at the utilization unless columns and rows are given. Then every net takes its delay from
// the library's net model. Empty on success, else why.
std::string PlaceSimple(Design& design, const NetlistOptions& options);

// Moves the cells of a placed design over the logic sites of its device, by simulated annealing, to
// a short total half-perimeter wire length; the ports stay. It starts from the cells shuffled over
// the logic sites by `seed`, whose wire length is `start`; `placed` is the wire length it ends with.
// The same seed gives the same placement. Empty on success, else why.
std::string PlaceAnneal(Design& design, std::uint64_t seed, long long& start, long long& placed);

}  // namespace kelmartool
