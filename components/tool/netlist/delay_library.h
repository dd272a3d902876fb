// The delays of an imported design, from a delay library file: a cell's delay by its type (or by
// its kind, for a type the library does not list) and a net's delay from the distance it spans on
// the placed device. Every number of a library is in ns. Plain C++ over the model, no Tcl.
#pragma once

#include <array>
#include <map>
#include <string>

namespace kelmartool {

// The kinds of cell the importer tells apart; a type it does not know is Other.
enum class CellKind { Lut, Gate, Ff, Carry, Ram, Other };
inline constexpr std::size_t kCellKinds = 6;

// The word of a kind, as the cell's `kind` property and a library's defaults spell it.
const char* CellKindWord(CellKind kind) noexcept;
// Flip-flops, latches and RAMs: clocked, with a clock-to-output delay and a setup time.
bool IsSequential(CellKind kind) noexcept;
// The kind of a cell type, by its name.
CellKind KindOfType(const std::string& type);

struct CellDelays {
    double delay = 0;  // propagation, or clock to output for a sequential kind
    double setup = 0;  // sequential kinds only
};

struct DelayLibrary {
    std::string file;
    std::array<CellDelays, kCellKinds> defaults;  // by kind
    std::map<std::string, CellDelays> cells;      // by type, every field filled in
    double netBase = 0;                           // a net's delay spanning no distance
    double netPerSite = 0;                        // added for each site of the net's span

    const CellDelays& Of(const std::string& type, CellKind kind) const;
    // `span`: the half perimeter of the box around the sites of the net's driver and loads.
    double NetDelay(long long span) const noexcept { return netBase + netPerSite * static_cast<double>(span); }
};

// Reads the library `text` of `file` into `out`. Empty on success, else where in the JSON and why;
// `out` is untouched then.
std::string ReadDelayLibrary(const std::string& file, const std::string& text, DelayLibrary& out);

// The library shipped with the tool: kelmartool_delays.json beside the tool's own shared library.
std::string DefaultDelayLibraryFile();

}  // namespace kelmartool
