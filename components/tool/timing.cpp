// The timing analysis object: named analyses, their settings, runs and reports.
//
// Settings a script changes:
//   set_constraint A NAME VALUE   NAME is one of
//       period:CLOCK          a positive number: the clock's period instead of the design's
//       input_delay[:PORT]    a number >= 0: when an input (that input) launches after the edge
//       output_delay[:PORT]   a number >= 0: how long before the edge an output (that output) is due
//       uncertainty           a number >= 0: taken off every required time
//       reference_clock       a clock: the clock that times the ports (default: the design's first)
//   disable_constraints / enable_constraints A NAME...      constraints set before
//   disable_cpt / enable_cpt A KIND ITEM...                 KIND cell, port, net or clock
//   set_endpoints A from|to only|except ITEM...             an empty item list with except drops the rule
//   set_query A paths FIELD... ?-ld N? ?-hf N?              fields of startpoint endpoint clock arrival
//                                                           required slack points, or *; -ld paths in all
//                                                           (0: the global max_paths), -hf per endpoint
//   set_query A fanout NETPATTERN... -hf N ?-ld N?          nets with at least N loads, at most -ld of them
//   set_filter A startpoint|endpoint|clock|through include|exclude|clear PATTERN...
//   set_filter A slack below|above|clear NUMBER
// Every list argument may also hold lists; their words are taken in order.
#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "TcltaskI/ITimingAnalysis.h"
#include "component.h"
#include "file_io.h"
#include "property.h"
#include "weak_state.h"
#include "timing_model.h"

namespace kelmartool {

namespace {

using CommonI::RESULT;

// The fields of a reported path, in the order a path's dict has them.
struct PathField {
    const char* name;
    Tcl_Obj* (*value)(const TimingPath&);
};
constexpr PathField kPathFieldTable[] = {
    {"startpoint", [](const TimingPath& p) { return NewText(p.startpoint); }},
    {"endpoint", [](const TimingPath& p) { return NewText(p.endpoint); }},
    {"clock", [](const TimingPath& p) { return NewText(p.clock); }},
    {"arrival", [](const TimingPath& p) { return NewDouble(p.arrival); }},
    {"required", [](const TimingPath& p) { return NewDouble(p.required); }},
    {"slack", [](const TimingPath& p) { return NewDouble(p.slack); }},
    {"points", [](const TimingPath& p) { return NewList(p.points); }},
};
const std::vector<std::string> kPathFields = [] {
    std::vector<std::string> names;
    for (const PathField& f : kPathFieldTable) names.push_back(f.name);
    return names;
}();

bool IsNumber(const std::string& text, double& value) {
    if (text.empty()) return false;
    char* end = nullptr;
    value = std::strtod(text.c_str(), &end);
    return end == text.c_str() + text.size() && std::isfinite(value);
}

Tcl_Obj* ConstraintsValue(const TimingSettings& s) {
    DictBuilder d;
    for (const auto& [name, c] : s.constraints)
        d.Add(name, DictBuilder().Add("value", c.value).Add("enabled", c.enabled).Take());
    return d.Take();
}

Tcl_Obj* CptValue(const TimingSettings& s) {
    DictBuilder d;
    for (const auto& [kind, items] : s.disabled)
        if (!items.empty()) d.Add(kind, NewList(std::vector<std::string>(items.begin(), items.end())));
    return d.Take();
}

Tcl_Obj* EndpointsValue(const TimingSettings& s) {
    DictBuilder d;
    for (const auto& [kind, rule] : s.endpoints)
        d.Add(kind, DictBuilder().Add("side", rule.side).Add("items", NewList(rule.items)).Take());
    return d.Take();
}

Tcl_Obj* QueriesValue(const TimingSettings& s) {
    DictBuilder d;
    for (const auto& [kind, q] : s.queries)
        d.Add(kind, DictBuilder().Add("items", NewList(q.items)).Add("ld", q.ld).Add("hf", q.hf).Take());
    return d.Take();
}

Tcl_Obj* FiltersValue(const TimingSettings& s) {
    DictBuilder d;
    for (const auto& [kind, f] : s.filters)
        d.Add(kind, DictBuilder().Add("mode", f.mode).Add("items", NewList(f.items)).Take());
    return d.Take();
}

// The fields the paths query asks for, in their fixed order.
std::vector<std::string> Fields(const TimingSettings& s) {
    auto it = s.queries.find("paths");
    if (it == s.queries.end()) return kPathFields;
    const auto& items = it->second.items;
    if (std::find(items.begin(), items.end(), "*") != items.end()) return kPathFields;
    std::vector<std::string> fields;
    for (const std::string& f : kPathFields)
        if (std::find(items.begin(), items.end(), f) != items.end()) fields.push_back(f);
    return fields;
}

Tcl_Obj* PathValue(const TimingPath& p, const std::vector<std::string>& fields) {
    DictBuilder d;
    for (const std::string& f : fields)
        for (const PathField& field : kPathFieldTable)
            if (f == field.name) d.Add(f, field.value(p));
    return d.Take();
}

Tcl_Obj* PathsValue(const Analysis& a) {
    if (!a.result) return Tcl_NewListObj(0, nullptr);
    const auto fields = Fields(a.settings);
    return ListOf(a.result->paths, [&](const TimingPath& p) { return PathValue(p, fields); });
}

Tcl_Obj* FanoutValue(const Analysis& a) {
    if (!a.result) return Tcl_NewListObj(0, nullptr);
    return ListOf(a.result->highFanout,
                  [](const FanoutNet& n) { return DictBuilder().Add("net", n.net).Add("fanout", n.fanout).Take(); });
}

std::string Status(const ToolState& state, const Analysis& a) {
    if (!a.result) return "new";
    return a.result->epoch == state.designEpoch ? "done" : "stale";
}

// The settings and results of an analysis, as get, set and properties -descriptors know them.
struct Descriptor {
    const char* name;
    const char* type;
    bool writable;
    const char* description;
    Tcl_Obj* (*value)(const ToolState&, const Analysis&);
};

using State = const ToolState&;
using An = const Analysis&;

constexpr Descriptor kSettings[] = {
    {"name", "string", true, "the display name of the analysis", [](State, An a) { return NewText(a.name); }},
    {"description", "string", true, "free text about the analysis", [](State, An a) { return NewText(a.description); }},
    {"status", "string", false, "new before the first run, done after it, stale once the design changed",
     [](State s, An a) { return NewText(Status(s, a)); }},
    {"worst_slack", "double", false, "the smallest slack of the last run, empty when no path was timed",
     [](State, An a) { return a.result && a.result->worstSlack ? NewDouble(*a.result->worstSlack) : NewText(""); }},
    {"total_negative_slack", "double", false, "the sum of the negative worst slacks of the endpoints",
     [](State, An a) { return NewDouble(a.result ? a.result->totalNegativeSlack : 0.0); }},
    {"endpoint_count", "int", false, "endpoints timed by the last run",
     [](State, An a) { return NewInt(a.result ? a.result->endpoints : 0); }},
    {"failing", "int", false, "endpoints with negative slack in the last run",
     [](State, An a) { return NewInt(a.result ? a.result->failing : 0); }},
    {"unconstrained", "int", false, "endpoints reached but timed by no clock",
     [](State, An a) { return NewInt(a.result ? a.result->unconstrained : 0); }},
    {"paths", "list", false, "the reported paths of the last run, worst first",
     [](State, An a) { return PathsValue(a); }},
    {"high_fanout", "list", false, "the nets found by the fanout query of the last run",
     [](State, An a) { return FanoutValue(a); }},
    {"constraints", "dict", false, "the constraints: name -> value and enabled",
     [](State, An a) { return ConstraintsValue(a.settings); }},
    {"cpt", "dict", false, "the items left out of path tracing, by kind",
     [](State, An a) { return CptValue(a.settings); }},
    {"endpoints", "dict", false, "where paths may start (from) and end (to)",
     [](State, An a) { return EndpointsValue(a.settings); }},
    {"queries", "dict", false, "what a run reports", [](State, An a) { return QueriesValue(a.settings); }},
    {"filters", "dict", false, "which computed paths are reported",
     [](State, An a) { return FiltersValue(a.settings); }},
};

Tcl_Obj* DescriptorValue(const Descriptor& d) {
    return DictBuilder()
        .Add("name", d.name)
        .Add("type", d.type)
        .Add("access", d.writable ? "read-write" : "read-only")
        .Add("description", d.description)
        .Take();
}

std::string Number(double value) { return TclValue(NewDouble(value)).Text(); }

class TimingAnalysis final : public Component<TcltaskI::ITimingAnalysis> {
public:
    explicit TimingAnalysis(const StatePtr& state) : m_state(state) {}

    RESULT properties(bool descriptors, Out& result, Msg& message) override {
        return m_state.On(message, [&](ToolState& state) -> RESULT {
            if (!descriptors) {
                std::vector<std::string> ids;
                for (const auto& [id, a] : Data(state).analyses) ids.push_back(id);
                return Answer(NewList(ids), result, message);
            }
            return Answer(ListOf(kSettings, DescriptorValue), result, message);
        });
    }

    RESULT delete_(const Str& analysis, Out& result, Msg& message) override {
        return m_state.On(message, [&](ToolState& state) -> RESULT {
            TimingData& data = Data(state);
            if (!Find(state, analysis, message)) return 0;
            std::vector<std::string> left;
            for (const auto& [id, a] : data.analyses)
                if (id != analysis.c_str()) left.push_back(id);
            if (!Answer(NewList(left), result, message)) return 0;
            data.analyses.erase(analysis.c_str());
            state.Changed();
            return 1;
        });
    }

    RESULT disable_constraints(const Str& analysis, const List& constraints, Out& result, Msg& message) override {
        return SwitchConstraints(analysis, constraints, false, result, message);
    }

    RESULT disable_cpt(const Str& analysis, const Str& kind, const List& items, Out& result, Msg& message) override {
        return SwitchCpt(analysis, kind, items, false, result, message);
    }

    RESULT enable_constraints(const Str& analysis, const List& constraints, Out& result, Msg& message) override {
        return SwitchConstraints(analysis, constraints, true, result, message);
    }

    RESULT get(const Str& analysis, const Str& name, Out& result, Msg& message) override {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            const std::string key = name.c_str();
            for (const Descriptor& d : kSettings)
                if (key == d.name) return Answer(d.value(state, a), result, message);
            return UnknownSetting(state, key, message);
        });
    }

    RESULT enable_cpt(const Str& analysis, const Str& kind, const List& items, Out& result, Msg& message) override {
        return SwitchCpt(analysis, kind, items, true, result, message);
    }

    RESULT new_(const Str& analysis, const Str& name, Out& result, Msg& message) override {
        return m_state.On(message, [&](ToolState& state) -> RESULT {
            const std::string id = analysis.c_str();
            if (id.empty() || id.find_first_of(" \t\n") != std::string::npos)
                return Refuse(state, message, Refusal::Value,
                              "the name of a timing analysis must be one word, not '" + id + "'");
            TimingData& data = Data(state);
            if (data.analyses.count(id))
                return Refuse(state, message, Refusal::Value, "a timing analysis named '" + id + "' exists already");
            Analysis a;
            a.id = id;
            a.name = name.IsEmpty() ? id : std::string(name.c_str());
            if (!Answer(NewText(id), result, message)) return 0;
            data.analyses.emplace(id, std::move(a));
            return 1;
        });
    }

    RESULT reset(const Str& analysis, Out& result, Msg& message) override {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            a.settings = TimingSettings{};
            a.result.reset();
            state.Changed();
            return Answer(Settings(state, a), result, message);
        });
    }

    RESULT run(const Str& analysis, bool overwrite, Out& result, Msg& message) override {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            const Design* design = state.CurrentDesign();
            if (!design) return Refuse(state, message, Refusal::NoProject, kNoProject);
            if (a.result && !overwrite)
                return Refuse(state, message, Refusal::State,
                              "timing analysis '" + a.id +
                                  "' has a result already: run it with -overwrite to replace the result");
            const int pathLimit = static_cast<int>(state.settings.Integer("max_paths", 0));
            TimingResult fresh;
            std::string error;
            if (!RunTiming(*design, a.settings, pathLimit, fresh, error))
                return Refuse(state, message, Refusal::Value, "timing analysis '" + a.id + "' failed: " + error);
            fresh.epoch = state.designEpoch;
            std::optional<TimingResult> previous = std::move(a.result);
            a.result = std::move(fresh);
            if (!Answer(PathsValue(a), result, message)) {
                a.result = std::move(previous);
                return 0;
            }
            Data(state).lastRun = a.id;
            state.Changed();
            return 1;
        });
    }

    RESULT save_as(const Str& analysis, const Str& file, Out& result, Msg& message) override {
        return WriteReport(analysis, file, result, message);
    }

    // The same report as save_as: scripts of either spelling expect the same file.
    RESULT saveas(const Str& analysis, const Str& file, Out& result, Msg& message) override {
        return WriteReport(analysis, file, result, message);
    }

    RESULT set(const Str& analysis, const Str& name, const Prop& value, Out& result, Msg& message) override {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            const std::string key = name.c_str();
            const std::string text = TextOf(value);
            std::string* target = key == "name" ? &a.name : key == "description" ? &a.description : nullptr;
            if (!target) {
                for (const Descriptor& d : kSettings)
                    if (key == d.name)
                        return Refuse(state, message, Refusal::Value,
                                      "the setting '" + key + "' of a timing analysis is read-only");
                return UnknownSetting(state, key, message);
            }
            if (key == "name" && text.empty())
                return Refuse(state, message, Refusal::Value, "the display name of a timing analysis cannot be empty");
            if (!Answer(NewText(text), result, message)) return 0;
            *target = text;
            return 1;
        });
    }

    RESULT set_constraint(const Str& analysis, const Str& name, const Prop& value, Out& result, Msg& message) override {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            const std::string key = name.c_str();
            const std::string text = TextOf(value);
            std::string error = CheckConstraint(state, key, text);
            if (!error.empty())
                return Refuse(state, message, error == kNoProject ? Refusal::NoProject : Refusal::Value, error);
            TimingSettings changed = a.settings;
            changed.constraints[key] = TimingSettings::Constraint{text, true};
            return Commit(a, std::move(changed), ConstraintsValue, result, message);
        });
    }

    RESULT set_endpoints(const Str& analysis, const Str& kind, const Str& side, const List& endpoints, Out& result,
                         Msg& message) override {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            const std::string k = kind.c_str(), s = side.c_str();
            if (k != "from" && k != "to")
                return Refuse(state, message, Refusal::Value, "unknown endpoint kind '" + k + "': use from or to");
            if (s != "only" && s != "except")
                return Refuse(state, message, Refusal::Value, "unknown endpoint side '" + s + "': use only or except");
            std::vector<std::string> items;
            if (!WordsOf(endpoints, items))
                return Refuse(state, message, Refusal::Value, "the endpoints are no proper list");
            const Design* design = state.CurrentDesign();
            if (!design) return Refuse(state, message, Refusal::NoProject, kNoProject);
            for (const std::string& item : items) {
                const Cell* cell = design->FindCell(item);
                const IoPort* port = design->FindPort(item);
                const bool fits = (cell && cell->sequential) || (port && port->output == (k == "to"));
                if (!fits)
                    return Refuse(state, message, Refusal::Value,
                                  "'" + item + "' is no " + (k == "from" ? "start" : "end") + " point: use " +
                                      (k == "from" ? "input" : "output") + " ports and sequential cells");
            }
            if (items.empty() && s == "only")
                return Refuse(state, message, Refusal::Value,
                              "set_endpoints " + k + " only needs at least one endpoint");
            TimingSettings changed = a.settings;
            if (items.empty())
                changed.endpoints.erase(k);
            else
                changed.endpoints[k] = TimingSettings::EndpointRule{s, items};
            return Commit(a, std::move(changed), EndpointsValue, result, message);
        });
    }

    RESULT set_query(const Str& analysis, const Str& kind, const List& items, int32_t ld, int32_t hf, Out& result,
                     Msg& message) override {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            const std::string k = kind.c_str();
            if (k != "paths" && k != "fanout")
                return Refuse(state, message, Refusal::Value, "unknown query kind '" + k + "': use paths or fanout");
            if (ld < 0 || hf < 0) return Refuse(state, message, Refusal::Value, "-ld and -hf cannot be negative");
            std::vector<std::string> words;
            if (!WordsOf(items, words))
                return Refuse(state, message, Refusal::Value, "the query items are no proper list");
            if (words.empty())
                return Refuse(state, message, Refusal::Value, "a " + k + " query needs at least one item");
            if (k == "paths") {
                for (const std::string& w : words)
                    if (w != "*" && std::find(kPathFields.begin(), kPathFields.end(), w) == kPathFields.end())
                        return Refuse(state, message, Refusal::Value,
                                      "unknown path field '" + w + "': use * or " + Join(kPathFields));
            } else if (hf < 1) {
                return Refuse(state, message, Refusal::Value,
                              "a fanout query needs -hf N, the least fanout it reports");
            }
            TimingSettings changed = a.settings;
            changed.queries[k] = TimingSettings::Query{words, ld, hf};
            return Commit(a, std::move(changed), QueriesValue, result, message);
        });
    }

    RESULT set_filter(const Str& analysis, const Str& kind, const Str& mode, const List& items, Out& result,
                      Msg& message) override {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            const std::string k = kind.c_str(), m = mode.c_str();
            static const std::vector<std::string> kinds{"startpoint", "endpoint", "clock", "through", "slack"};
            if (std::find(kinds.begin(), kinds.end(), k) == kinds.end())
                return Refuse(state, message, Refusal::Value, "unknown filter kind '" + k + "': use " + Join(kinds));
            const bool slack = k == "slack";
            if (m != "clear" && (slack ? m != "below" && m != "above" : m != "include" && m != "exclude"))
                return Refuse(state, message, Refusal::Value,
                              "unknown mode '" + m + "' of the " + k + " filter: use " +
                                  (slack ? "below, above or clear" : "include, exclude or clear"));
            std::vector<std::string> words;
            if (!WordsOf(items, words))
                return Refuse(state, message, Refusal::Value, "the filter items are no proper list");
            TimingSettings changed = a.settings;
            if (m == "clear") {
                changed.filters.erase(k);
            } else {
                double bound = 0;
                if (slack && (words.size() != 1 || !IsNumber(words.front(), bound)))
                    return Refuse(state, message, Refusal::Value, "the slack filter needs one number");
                if (words.empty())
                    return Refuse(state, message, Refusal::Value, "the " + k + " filter needs at least one pattern");
                if (slack) words.front() = Number(bound);
                changed.filters[k] = TimingSettings::Filter{m, words};
            }
            return Commit(a, std::move(changed), FiltersValue, result, message);
        });
    }

    RESULT show_settings(const Str& analysis, Out& result, Msg& message) override {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            return Answer(Settings(state, a), result, message);
        });
    }

private:
    // Runs `op` on the named analysis, when there is one (Find).
    template <class Op>
    RESULT OnAnalysis(const Str& analysis, Msg& message, Op op) {
        return m_state.On(message, [&](ToolState& state) -> RESULT {
            Analysis* a = Find(state, analysis, message);
            return a ? op(state, *a) : 0;
        });
    }

    static TimingData& Data(ToolState& state) {
        if (!state.timing) state.timing = std::make_shared<TimingData>();
        return *state.timing;
    }

    static Analysis* Find(ToolState& state, const Str& analysis, Msg& message) {
        TimingData& data = Data(state);
        auto it = data.analyses.find(analysis.c_str());
        if (it != data.analyses.end()) return &it->second;
        std::vector<std::string> ids;
        for (const auto& [id, a] : data.analyses) ids.push_back(id);
        Refuse(state, message, Refusal::Unknown, {"ANALYSIS", analysis.c_str()},
               "no timing analysis named '" + std::string(analysis.c_str()) + "'" +
                   (ids.empty() ? std::string(": make one with timing new NAME") : "; the analyses are: " + Join(ids)));
        return nullptr;
    }

    static RESULT UnknownSetting(const ToolState& state, const std::string& key, Msg& message) {
        std::vector<std::string> names;
        for (const Descriptor& d : kSettings) names.push_back(d.name);
        return Refuse(state, message, Refusal::Unknown, {"SETTING", key},
                      "no setting '" + key + "' in a timing analysis; the settings are: " + Join(names));
    }

    static Tcl_Obj* Settings(const ToolState& state, const Analysis& a) {
        return DictBuilder()
            .Add("name", a.name)
            .Add("description", a.description)
            .Add("status", Status(state, a))
            .Add("constraints", ConstraintsValue(a.settings))
            .Add("cpt", CptValue(a.settings))
            .Add("endpoints", EndpointsValue(a.settings))
            .Add("queries", QueriesValue(a.settings))
            .Add("filters", FiltersValue(a.settings))
            .Take();
    }

    // Stores the changed settings once the answer could be made, so that a failure leaves them as
    // they were.
    static RESULT Commit(Analysis& a, TimingSettings changed, Tcl_Obj* (*answer)(const TimingSettings&), Out& result,
                         Msg& message) {
        if (!Answer(answer(changed), result, message)) return 0;
        a.settings = std::move(changed);
        return 1;
    }

    static std::string CheckConstraint(const ToolState& state, const std::string& name, const std::string& value) {
        const auto colon = name.find(':');
        const std::string type = name.substr(0, colon);
        const bool hasObject = colon != std::string::npos;
        const std::string object = hasObject ? name.substr(colon + 1) : std::string();
        const Design* design = state.CurrentDesign();
        double number = 0;
        const bool numeric = IsNumber(value, number);
        // Times beyond kMaxTime would let the sums of a run overflow to infinity.
        const std::string tooLarge = "the constraint " + name + " must be at most " +
                                     std::to_string(static_cast<long long>(kMaxTime)) + " ns, not '" + value + "'";
        if (type == "period") {
            if (!design) return kNoProject;
            if (!hasObject || !design->FindClock(object))
                return "the constraint period:CLOCK needs a clock of the design";
            if (!numeric || number <= 0) return "a clock period must be a positive number, not '" + value + "'";
            if (number > kMaxTime) return tooLarge;
            return {};
        }
        if (type == "input_delay" || type == "output_delay") {
            if (hasObject) {
                if (!design) return kNoProject;
                const IoPort* port = design->FindPort(object);
                const bool output = type == "output_delay";
                if (!port || port->output != output)
                    return "the constraint " + type + ":PORT needs an " + (output ? "output" : "input") +
                           " port of the design, not '" + object + "'";
            }
            if (!numeric || number < 0) return "a delay must be a number of at least 0, not '" + value + "'";
            if (number > kMaxTime) return tooLarge;
            return {};
        }
        if (type == "uncertainty" && !hasObject) {
            if (!numeric || number < 0) return "the uncertainty must be a number of at least 0, not '" + value + "'";
            if (number > kMaxTime) return tooLarge;
            return {};
        }
        if (type == "reference_clock" && !hasObject) {
            if (!design) return kNoProject;
            if (!design->FindClock(value))
                return "the reference clock must be a clock of the design, not '" + value + "'";
            return {};
        }
        return "unknown constraint '" + name +
               "': use period:CLOCK, input_delay, input_delay:PORT, output_delay, output_delay:PORT, uncertainty or "
               "reference_clock";
    }

    RESULT SwitchConstraints(const Str& analysis, const List& constraints, bool enabled, Out& result, Msg& message) {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            std::vector<std::string> names;
            if (!WordsOf(constraints, names))
                return Refuse(state, message, Refusal::Value, "the constraint names are no proper list");
            TimingSettings changed = a.settings;
            for (const std::string& n : names) {
                auto it = changed.constraints.find(n);
                if (it == changed.constraints.end())
                    return Refuse(state, message, Refusal::Unknown, {"CONSTRAINT", n},
                                  "timing analysis '" + a.id + "' has no constraint '" + n + "'");
                it->second.enabled = enabled;
            }
            return Commit(a, std::move(changed), ConstraintsValue, result, message);
        });
    }

    RESULT SwitchCpt(const Str& analysis, const Str& kind, const List& items, bool enabled, Out& result, Msg& message) {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            const std::string k = kind.c_str();
            const auto objectKind = KindFromWord(k);
            if (!objectKind || (*objectKind != Kind::Cell && *objectKind != Kind::Port && *objectKind != Kind::Net &&
                                *objectKind != Kind::Clock))
                return Refuse(state, message, Refusal::Value, "unknown kind '" + k + "': use cell, port, net or clock");
            std::vector<std::string> words;
            if (!WordsOf(items, words)) return Refuse(state, message, Refusal::Value, "the items are no proper list");
            const Design* design = state.CurrentDesign();
            if (!design) return Refuse(state, message, Refusal::NoProject, kNoProject);
            TimingSettings changed = a.settings;
            auto& set = changed.disabled[k];
            for (const std::string& w : words) {
                const auto ref = design->Find(w);
                if (!ref || ref->kind != *objectKind)
                    return Refuse(state, message, Refusal::Value, "'" + w + "' is no " + k + " of the design");
                if (enabled)
                    set.erase(w);
                else
                    set.insert(w);
            }
            if (set.empty()) changed.disabled.erase(k);
            return Commit(a, std::move(changed), CptValue, result, message);
        });
    }

    RESULT WriteReport(const Str& analysis, const Str& file, Out& result, Msg& message) {
        return OnAnalysis(analysis, message, [&](ToolState& state, Analysis& a) -> RESULT {
            if (!a.result)
                return Refuse(state, message, Refusal::State,
                              "timing analysis '" + a.id + "' has no result: run it first");
            const std::string path = file.c_str();
            if (path.empty()) return Refuse(state, message, Refusal::Value, "the report needs a file name");
            std::ostringstream text;
            const TimingResult& r = *a.result;
            text << "Timing analysis " << a.id << " (" << a.name << ")\n";
            if (!a.description.empty()) text << "Description: " << a.description << "\n";
            text << "Design: " << r.design << "\n";
            text << "Status: " << Status(state, a) << "\n";
            text << "Endpoints: " << r.endpoints << ", failing: " << r.failing << ", unconstrained: " << r.unconstrained
                 << "\n";
            text << "Worst slack: " << (r.worstSlack ? Number(*r.worstSlack) : std::string("none")) << "\n";
            text << "Total negative slack: " << Number(r.totalNegativeSlack) << "\n";
            for (std::size_t i = 0; i < r.paths.size(); ++i) {
                const TimingPath& p = r.paths[i];
                text << "\nPath " << i + 1 << ": " << p.startpoint << " -> " << p.endpoint << ", clock " << p.clock
                     << "\n"
                     << "  arrival " << Number(p.arrival) << ", required " << Number(p.required) << ", slack "
                     << Number(p.slack) << "\n"
                     << "  through " << Join(p.points, " ") << "\n";
            }
            if (!r.highFanout.empty()) {
                text << "\nHigh fanout nets:\n";
                for (const FanoutNet& n : r.highFanout) text << "  " << n.net << " " << n.fanout << "\n";
            }
            if (std::string why; !WriteTextFile(path, text.str(), why))
                return Refuse(state, message, Refusal::File, {path},
                              "cannot write the timing report to '" + path + "': " + why);
            return Answer(NewText(path), result, message);
        });
    }

    WeakState m_state;
};

}  // namespace

TcltaskI::ITimingAnalysis* NewTimingAnalysis(const StatePtr& state) { return new TimingAnalysis(state); }

}  // namespace kelmartool
