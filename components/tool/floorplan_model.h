// The open floorplan of a tool state, its constraint files and its checks.
//
// A floorplan is edited as a working copy of the design's blocks, prohibited sites and port sites,
// on a device of its own (the design's, or the one open_empty describes). save puts the copy back
// into the design and writes the project file; close -nosave forgets it.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "design.h"

namespace kelmartool {

struct Region {
    int x0 = 0, y0 = 0, x1 = 0, y1 = 0;

    bool Contains(int x, int y) const noexcept { return x >= x0 && x <= x1 && y >= y0 && y <= y1; }
    bool Overlaps(const Region& o) const noexcept { return x0 <= o.x1 && o.x0 <= x1 && y0 <= o.y1 && o.y0 <= y1; }
    // In 64 bits: a region of a large device, or one given by four numbers, has more sites than an
    // int holds.
    long long Sites() const noexcept {
        return (static_cast<long long>(x1) - x0 + 1) * (static_cast<long long>(y1) - y0 + 1);
    }
};

// A region is written "X0Y0:X3Y3" (the corner sites) or as four numbers "x0 y0 x1 y1"; either way
// the corners are put in order. The region may reach beyond a device: drc finds that.
bool ParseRegion(const std::string& text, Region& region, std::string& error);
// The coordinates of a site name "X<col>Y<row>", on a device or not.
bool ParseSiteName(std::string_view name, int& x, int& y);
std::string RegionText(const Region& region);
std::optional<Region> RegionOf(const Block& block);
void SetRegion(Block& block, const std::optional<Region>& region);

// The constraints a floorplan file holds.
struct FloorplanConstraints {
    std::vector<Block> blocks;
    std::set<std::string> prohibited;          // site names
    std::map<std::string, std::string> ports;  // port -> site
    friend bool operator==(const FloorplanConstraints&, const FloorplanConstraints&) = default;
};

struct FloorplanData {
    bool open = false;
    uint64_t epoch = 0;  // the design epoch the copy belongs to
    std::string name;
    Device device;
    FloorplanConstraints constraints;  // ports holds every placed port of the design
    int clockLimit = 0;                // clock nets a region may hold; 0 is no limit
    bool modified = false;
    Region view;
};

// Adds `extra` to `base`: a block of both gets the cells it lacks and the region and constraints of
// `extra`; sites and port locations are added.
void MergeConstraints(FloorplanConstraints& base, const FloorplanConstraints& extra);

// The four constraint file forms (floorplan_io.cpp documents each).
enum class ConstraintForm { Ucf, Csv, Vhdl, Vlog };
const char* FormWord(ConstraintForm form) noexcept;
// The text of the constraints in one form, when the form holds them exactly: read back, the text
// gives the same constraints. False otherwise, with `error` naming the first item the form cannot
// hold (a line break in a value, a port name that is no word of vhdl, ...).
bool FormatConstraints(ConstraintForm form, const FloorplanConstraints& constraints, const std::string& design,
                       std::string& text, std::string& error);
// Reads the text of one form; the error names the line. Only the syntax is checked here.
bool ParseConstraints(ConstraintForm form, const std::string& text, FloorplanConstraints& out, std::string& error);

// The checks and analyses (floorplan_check.cpp).

// Whether the constraints fit the design on `device`: known cells and ports, each cell in one block
// at most, known block constraints with proper values, sites on the device. Empty when they do.
std::string CheckConstraints(const Design& design, const Device& device, const FloorplanConstraints& constraints);
// A capacity constraint's value: a whole number from 0 that a long long holds, or nothing.
std::optional<long long> ParseCapacity(const std::string& value);
// Checks the value of a block constraint (region, capacity, comment); empty when it is proper.
std::string CheckBlockConstraint(const std::string& name, const std::string& value);
struct DrcFinding {
    std::string rule;  // overlap, out_of_device, prohibited_site, outside_region, capacity
    std::vector<std::string> objects;
    std::string message;
};
std::vector<DrcFinding> RunDrc(const Design& design, const FloorplanData& plan);
// The cells a block may hold: its capacity constraint, else the free sites of its region times the
// site capacity; nothing when it has neither.
std::optional<long long> CapacityOf(const Block& block, const FloorplanData& plan);

struct SsoBank {
    std::string bank;
    std::vector<std::string> outputs;
    int limit = 0;  // 0: no limit
};
std::vector<SsoBank> RunSso(const Design& design, const FloorplanData& plan);

struct ClockRegion {
    std::string block;
    Region region;
    std::vector<std::string> nets;  // clock nets of the sequential cells placed in the region
};
std::vector<ClockRegion> RunClockAnalysis(const Design& design, const FloorplanData& plan);

}  // namespace kelmartool
