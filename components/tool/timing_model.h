// The timing analyses of a tool state: their settings, their results and the engine that computes
// a result from a design.
//
// An analysis is static and single-cycle. Paths start at input ports (at their input delay) and at
// sequential cells (at their clock-to-output delay), run through combinational cells and nets, and
// end at sequential cells (required: the period of their clock minus their setup time) and at output
// ports (required: the period of the reference clock minus their output delay). The slack of a path
// is required minus arrival; the uncertainty is taken off every required time.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "design.h"

namespace kelmartool {

// What a script may change about an analysis. Every setting names objects by their plain names.
struct TimingSettings {
    // A constraint has a name of the form TYPE or TYPE:OBJECT (see kConstraintTypes in timing.cpp);
    // a disabled one is kept but takes no part in a run.
    struct Constraint {
        std::string value;
        bool enabled = true;
    };
    std::map<std::string, Constraint> constraints;

    // Path tracing switched off, by kind ("cell", "port", "net", "clock"): a disabled item starts, ends
    // and carries no path; a disabled clock does so for every sequential cell it clocks.
    std::map<std::string, std::set<std::string>> disabled;

    // Where paths may start ("from") and end ("to"): "only" the items, or all "except" them.
    struct EndpointRule {
        std::string side;
        std::vector<std::string> items;
    };
    std::map<std::string, EndpointRule> endpoints;

    // What a run reports. "paths": the fields of each path (or "*"), at most `ld` paths in all (0: the
    // global max_paths) and `hf` per endpoint (0: one). "fanout": nets matching the patterns with at
    // least `hf` loads, at most `ld` of them (0: all).
    struct Query {
        std::vector<std::string> items;
        int ld = 0;
        int hf = 0;
    };
    std::map<std::string, Query> queries;

    // Which of the computed paths are reported. Name filters ("startpoint", "endpoint", "clock",
    // "through") "include" or "exclude" glob patterns; the "slack" filter keeps paths "below" or
    // "above" one number.
    struct Filter {
        std::string mode;
        std::vector<std::string> items;
    };
    std::map<std::string, Filter> filters;
};

struct TimingPath {
    std::string startpoint;
    std::string endpoint;
    std::string clock;  // the capturing clock
    double arrival = 0;
    double required = 0;
    double slack = 0;
    std::vector<std::string> points;  // start, the cells passed, end
};

struct FanoutNet {
    std::string net;
    int fanout = 0;
};

struct TimingResult {
    uint64_t epoch = 0;             // the design epoch the result was computed for
    std::string design;             // the design's name
    std::vector<TimingPath> paths;  // the reported paths, worst first
    int endpoints = 0;              // endpoints reached by at least one path
    int failing = 0;                // endpoints with negative slack
    int unconstrained = 0;          // endpoints reached but without a clock to time them
    std::optional<double> worstSlack;
    double totalNegativeSlack = 0;  // the sum of the negative worst slacks of the endpoints
    std::vector<FanoutNet> highFanout;
};

struct Analysis {
    std::string id;    // the word scripts name it by
    std::string name;  // the display name
    std::string description;
    TimingSettings settings;
    std::optional<TimingResult> result;
};

struct TimingData {
    std::map<std::string, Analysis> analyses;
    std::string lastRun;  // the analysis run last, whose worst path the view draws
};

// Computes the result of `settings` over `design`. `pathLimit` applies when the paths query sets no
// limit of its own. False with `error` set on a combinational loop or a constraint that names no
// object of the design; `out` is untouched then.
bool RunTiming(const Design& design, const TimingSettings& settings, int pathLimit, TimingResult& out,
               std::string& error);

// Times are kept to a femtosecond, so that sums of decimal delays read as the decimals they are.
double RoundTime(double value) noexcept;

}  // namespace kelmartool
