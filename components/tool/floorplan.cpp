// The floorplan object: a working copy of the current design's blocks, prohibited sites and port
// sites on a device, with its analyses and its view.
//
// The words of the operations whose meaning is the tool's own:
//   open_full FILE FORM MODE   opens the design's floorplan and reads the constraint FILE of FORM
//                              (ucf, csv, vhdl or vlog) into it: MODE replace puts the file's blocks
//                              and prohibited sites in place of the design's, merge adds them.
//   open_empty NAME DEVICE COLUMNS ROWS BANKS LAYOUT SSO_LIMIT SITE_CAPACITY CLOCK_LIMIT
//                              opens a floorplan without blocks or prohibited sites on a new device:
//                              COLUMNS x ROWS sites, BANKS banks of equal stripes along the LAYOUT
//                              (columns or rows), each allowed SSO_LIMIT outputs (0: no limit), sites
//                              holding SITE_CAPACITY cells, regions CLOCK_LIMIT clock nets (0: no
//                              limit). Saving it gives the design that device.
//   make_pin_compatible FROM TO OFFSET MODE
//                              the ports of the list TO take the pin placement of the ports of the
//                              list FROM, pair by pair: MODE copy places each on its partner's site
//                              moved by OFFSET ("dx dy"), MODE swap exchanges the two sites (OFFSET
//                              must then be "0 0" or empty). No two ports may end on one site.
//   zoom SITE SITE             shows the sites between the two corners; zoom block NAME shows the
//                              region of a block, zoom fit ANYTHING the whole device.
#include <algorithm>
#include <cstdlib>
#include <memory>
#include <string>
#include <vector>

#include "TcltaskI/IXFloorplan.h"
#include "component.h"
#include "file_io.h"
#include "floorplan_model.h"
#include "floorplan_values.h"
#include "project.h"
#include "property.h"
#include "weak_state.h"

namespace kelmartool {

namespace {

using CommonI::RESULT;

constexpr const char* kNotOpen = "no floorplan is open: open one with floorplan open";
constexpr const char* kNameKey = "floorplan_name";
constexpr const char* kClockLimitKey = "clock_limit";

const std::vector<std::string> kWritable{"name", "site_capacity", "sso_limit", "clock_limit"};
// Sites prohibit may name in all: each is a name kept and answered, and a range of a large device
// would otherwise ask for billions of them.
constexpr long long kMaxProhibited = 1000000;
std::string Quote(const std::string& name) { return "'" + name + "'"; }

bool WholeNumber(const std::string& text, long long low, long long high, int& out) {
    if (text.empty()) return false;
    char* end = nullptr;
    const long long n = std::strtoll(text.c_str(), &end, 10);
    if (*end != '\0' || n < low || n > high) return false;
    out = static_cast<int>(n);
    return true;
}

std::vector<std::string> Words(const std::string& text) {
    std::vector<std::string> words;
    TclValue value(NewText(text));
    int count = 0;
    Tcl_Obj** items = nullptr;
    if (Tcl_ListObjGetElements(nullptr, value.get(), &count, &items) == TCL_OK)
        for (int i = 0; i < count; ++i) words.emplace_back(Tcl_GetString(items[i]));
    return words;
}

std::optional<ConstraintForm> FormFromWord(const std::string& word) {
    for (ConstraintForm f : {ConstraintForm::Ucf, ConstraintForm::Csv, ConstraintForm::Vhdl, ConstraintForm::Vlog})
        if (word == FormWord(f)) return f;
    return std::nullopt;
}

// Reads and parses one constraint file.
bool Load(ConstraintForm form, const std::string& file, FloorplanConstraints& out, std::string& error) {
    std::string text, why;
    if (!ReadTextFile(file, text, why)) {
        error = std::string("cannot read the ") + FormWord(form) + " file '" + file + "': " + why;
        return false;
    }
    if (!ParseConstraints(form, text, out, error)) {
        error = "'" + file + "': " + error;
        return false;
    }
    return true;
}

class Floorplan final : public Component<TcltaskI::IXFloorplan> {
public:
    explicit Floorplan(const StatePtr& state) : m_state(state) {}

    RESULT open(Out& result, Msg& message) override {
        return Opening(result, message, [](ToolState&, FloorplanData&) -> RESULT { return 1; });
    }

    RESULT open_full(const Str& s1, const Str& s2, const Str& s3, Out& result, Msg& message) override {
        return Opening(result, message, [&](ToolState& state, FloorplanData& fresh) -> RESULT {
            const std::string file = s1.c_str(), formWord = s2.c_str(), mode = s3.c_str();
            const auto form = FormFromWord(formWord);
            if (!form)
                return Refuse(state, message, Refusal::Value,
                              "unknown constraint form '" + formWord + "': use ucf, csv, vhdl or vlog");
            if (mode != "replace" && mode != "merge")
                return Refuse(state, message, Refusal::Value, "unknown mode '" + mode + "': use replace or merge");
            FloorplanConstraints read;
            std::string error;
            if (!Load(*form, file, read, error)) return Refuse(state, message, Refusal::File, {file}, error);
            if (mode == "replace") {
                fresh.constraints.blocks.clear();
                fresh.constraints.prohibited.clear();
            }
            MergeConstraints(fresh.constraints, read);
            error = CheckConstraints(*state.CurrentDesign(), fresh.device, fresh.constraints);
            if (!error.empty()) return Refuse(state, message, Refusal::File, {file}, "'" + file + "': " + error);
            fresh.modified = true;
            return 1;
        });
    }

    RESULT open_empty(const Str& s1, const Str& s2, const Str& s3, const Str& s4, const Str& s5, const Str& s6,
                      const Str& s7, const Str& s8, const Str& s9, Out& result, Msg& message) override {
        return Opening(result, message, [&](ToolState& state, FloorplanData& fresh) -> RESULT {
            const std::string name = s1.c_str(), device = s2.c_str(), layout = s6.c_str();
            int columns = 0, rows = 0, banks = 0, sso = 0, capacity = 0, clocks = 0;
            if (name.empty()) return Refuse(state, message, Refusal::Value, "the floorplan needs a name");
            if (device.empty()) return Refuse(state, message, Refusal::Value, "the device needs a name");
            if (!WholeNumber(s3.c_str(), 1, kMaxSide, columns))
                return Refuse(state, message, Refusal::Value,
                              "the columns must be a whole number from 1, not '" + std::string(s3.c_str()) + "'");
            if (!WholeNumber(s4.c_str(), 1, kMaxSide, rows))
                return Refuse(state, message, Refusal::Value,
                              "the rows must be a whole number from 1, not '" + std::string(s4.c_str()) + "'");
            if (layout != "columns" && layout != "rows")
                return Refuse(state, message, Refusal::Value,
                              "unknown bank layout '" + layout + "': use columns or rows");
            const int stripes = layout == "columns" ? columns : rows;
            const int most = std::min(stripes, kMaxBanks);
            if (!WholeNumber(s5.c_str(), 1, most, banks))
                return Refuse(state, message, Refusal::Value,
                              "the banks must be a whole number from 1 to " + std::to_string(most) + ", not '" +
                                  std::string(s5.c_str()) + "'");
            if (!WholeNumber(s7.c_str(), 0, kMaxCount, sso))
                return Refuse(
                    state, message, Refusal::Value,
                    "the sso limit must be a whole number of at least 0, not '" + std::string(s7.c_str()) + "'");
            if (!WholeNumber(s8.c_str(), 1, kMaxCount, capacity))
                return Refuse(state, message, Refusal::Value,
                              "the site capacity must be a whole number from 1, not '" + std::string(s8.c_str()) + "'");
            if (!WholeNumber(s9.c_str(), 0, kMaxCount, clocks))
                return Refuse(
                    state, message, Refusal::Value,
                    "the clock limit must be a whole number of at least 0, not '" + std::string(s9.c_str()) + "'");
            Device d;
            d.name = device;
            d.columns = columns;
            d.rows = rows;
            d.siteCapacity = capacity;
            for (int i = 0; i < banks; ++i) {
                Bank b;
                b.name = "BANK" + std::to_string(i);
                const int first = static_cast<int>(static_cast<long long>(i) * stripes / banks);
                const int last = static_cast<int>(static_cast<long long>(i + 1) * stripes / banks) - 1;
                if (layout == "columns")
                    b.x0 = first, b.x1 = last, b.y0 = 0, b.y1 = rows - 1;
                else
                    b.x0 = 0, b.x1 = columns - 1, b.y0 = first, b.y1 = last;
                b.ssoLimit = sso;
                d.banks.push_back(std::move(b));
            }
            fresh.name = name;
            fresh.device = std::move(d);
            fresh.constraints.blocks.clear();
            fresh.constraints.prohibited.clear();
            fresh.clockLimit = clocks;
            fresh.view = WholeDevice(fresh.device);
            fresh.modified = true;
            return 1;
        });
    }

    RESULT close(bool nosave, Out& result, Msg& message) override {
        return m_state.On(message, [&](ToolState& state) -> RESULT {
            FloorplanData& plan = Plan(state);
            if (!plan.open) return Refuse(state, message, Refusal::State, kNotOpen);
            Saved saved;
            if (!nosave && !Commit(state, saved, message)) return 0;
            if (!Answer(DictBuilder().Add("saved", !nosave).Add("file", saved.file).Add("changed", saved.changed).Take(),
                        result, message))
                return 0;
            plan = FloorplanData{};
            state.Changed();
            return 1;
        });
    }

    RESULT save(Out& result, Msg& message) override {
        return m_state.On(message, [&](ToolState& state) -> RESULT {
            Saved saved;
            if (!Commit(state, saved, message)) return 0;
            return Answer(DictBuilder().Add("file", saved.file).Add("changed", saved.changed).Take(), result, message);
        });
    }

    RESULT import(const Str& ucf, const Str& csv, const Str& vhdl, const Str& vlog, Out& result,
                  Msg& message) override {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            FloorplanConstraints read;
            bool any = false;
            for (const auto& [form, file] : Files(ucf, csv, vhdl, vlog)) {
                FloorplanConstraints one;
                std::string error;
                if (!Load(form, file, one, error)) return Refuse(state, message, Refusal::File, {file}, error);
                MergeConstraints(read, one);
                any = true;
            }
            if (!any)
                return Refuse(state, message, Refusal::Value,
                              "nothing to import: give -ucf, -csv, -vhdl or -vlog with a file");
            // The files' blocks and prohibited sites take the place of the floorplan's; ports they do not
            // name stay where they are.
            FloorplanConstraints changed = plan.constraints;
            changed.blocks = read.blocks;
            changed.prohibited = read.prohibited;
            for (const auto& [port, site] : read.ports) changed.ports[port] = site;
            if (std::string error = CheckConstraints(*state.CurrentDesign(), plan.device, changed); !error.empty())
                return Refuse(state, message, Refusal::Value, "the imported constraints do not fit: " + error);
            Tcl_Obj* answer = DictBuilder()
                                  .Add("blocks", read.blocks.size())
                                  .Add("prohibited", read.prohibited.size())
                                  .Add("ports", read.ports.size())
                                  .Take();
            if (!Answer(answer, result, message)) return 0;
            plan.constraints = std::move(changed);
            plan.modified = true;
            state.Changed();
            return 1;
        });
    }

    RESULT export_(const Str& ucf, const Str& csv, const Str& vhdl, const Str& vlog, Out& result,
                   Msg& message) override {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            // Every text is made and checked before any file is written; each file is then
            // replaced whole or not at all.
            const auto files = Files(ucf, csv, vhdl, vlog);
            if (files.empty())
                return Refuse(state, message, Refusal::Value,
                              "nothing to export: give -ucf, -csv, -vhdl or -vlog with a file");
            std::vector<std::string> texts(files.size()), written;
            std::string why;
            auto failed = [&](ConstraintForm form, const std::string& file) {
                return Refuse(state, message, Refusal::File, {file},
                              std::string("cannot write the ") + FormWord(form) + " file '" + file + "': " + why);
            };
            for (std::size_t i = 0; i < files.size(); ++i)
                if (!FormatConstraints(files[i].first, plan.constraints, state.CurrentDesign()->name, texts[i], why))
                    return failed(files[i].first, files[i].second);
            for (std::size_t i = 0; i < files.size(); ++i) {
                if (!WriteTextFile(files[i].second, texts[i], why)) return failed(files[i].first, files[i].second);
                written.push_back(files[i].second);
            }
            return Answer(NewList(written), result, message);
        });
    }

    RESULT group(const Str& block, const Prop& cells, Out& result, Msg& message) override {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            const std::string name = block.c_str();
            if (name.empty() || name.find_first_of(" \t\n") != std::string::npos)
                return Refuse(state, message, Refusal::Value, "a block name must be one word, not '" + name + "'");
            std::vector<std::string> names;
            std::string error;
            TclValue value = ValueOf(cells);
            if (!value || !ResolveObjects(state, value.get(), names, error)) return Fail(message, error);
            if (names.empty())
                return Refuse(state, message, Refusal::Value, "block " + Quote(name) + " needs at least one cell");
            const Design& design = *state.CurrentDesign();
            FloorplanConstraints changed = plan.constraints;
            auto it = std::find_if(changed.blocks.begin(), changed.blocks.end(),
                                   [&](const Block& b) { return b.name == name; });
            if (it == changed.blocks.end()) {
                changed.blocks.push_back(Block{});
                it = std::prev(changed.blocks.end());
                it->name = name;
            }
            for (const std::string& cell : names) {
                if (!design.FindCell(cell)) return Refuse(state, message, Refusal::Value, Quote(cell) + " is no cell");
                for (const Block& other : changed.blocks)
                    if (other.name != name &&
                        std::find(other.cells.begin(), other.cells.end(), cell) != other.cells.end())
                        return Refuse(state, message, Refusal::Value,
                                      "cell " + Quote(cell) + " is in block " + Quote(other.name) + " already");
                if (std::find(it->cells.begin(), it->cells.end(), cell) == it->cells.end()) it->cells.push_back(cell);
            }
            if (!Answer(NewList(it->cells), result, message)) return 0;
            Keep(state, plan, std::move(changed));
            return 1;
        });
    }

    RESULT ungroup(const Prop& block, Out& result, Msg& message) override {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            std::vector<std::string> names;
            if (!BlockNames(state, plan, block, names, message)) return 0;
            FloorplanConstraints changed = plan.constraints;
            std::erase_if(changed.blocks, [&names](const Block& b) {
                return std::find(names.begin(), names.end(), b.name) != names.end();
            });
            if (!Answer(NewList(BlockList(changed)), result, message)) return 0;
            Keep(state, plan, std::move(changed));
            return 1;
        });
    }

    RESULT properties(Out& result, Msg& message) override {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            return Answer(FloorplanValue(state, plan), result, message);
        });
    }

    RESULT get(const Str& name, Out& result, Msg& message) override {
        return m_state.On(message, [&](ToolState& state) -> RESULT {
            const std::string key = name.c_str();
            if (key == "open") return Answer(NewBool(Plan(state).open), result, message);
            if (std::find(kFloorplanProperties.begin(), kFloorplanProperties.end(), key) == kFloorplanProperties.end())
                return Unknown(state, key, message);
            FloorplanData* plan = Ready(state, message);
            if (!plan) return 0;
            return Answer(FloorplanProperty(state, *plan, key), result, message);
        });
    }

    RESULT set(const Str& name, const Str& value, Out& result, Msg& message) override {
        return m_state.On(message, [&](ToolState& state) -> RESULT {
            const std::string key = name.c_str(), text = value.c_str();
            if (std::find(kWritable.begin(), kWritable.end(), key) == kWritable.end()) {
                if (key == "open" || std::find(kFloorplanProperties.begin(), kFloorplanProperties.end(), key) !=
                                         kFloorplanProperties.end())
                    return Refuse(state, message, Refusal::Value, "the floorplan setting '" + key + "' is read-only");
                return Unknown(state, key, message);
            }
            FloorplanData* plan = Ready(state, message);
            if (!plan) return 0;
            FloorplanData changed = *plan;
            int number = 0;
            if (key == "name") {
                if (text.empty()) return Refuse(state, message, Refusal::Value, "the floorplan needs a name");
                changed.name = text;
            } else if (key == "site_capacity") {
                if (!WholeNumber(text, 1, kMaxCount, number))
                    return Refuse(state, message, Refusal::Value,
                                  "the site capacity must be a whole number from 1, not '" + text + "'");
                changed.device.siteCapacity = number;
            } else if (key == "clock_limit") {
                if (!WholeNumber(text, 0, kMaxCount, number))
                    return Refuse(state, message, Refusal::Value,
                                  "the clock limit must be a whole number of at least 0, not '" + text + "'");
                changed.clockLimit = number;
            } else if (WholeNumber(text, 0, kMaxCount, number)) {
                for (Bank& b : changed.device.banks) b.ssoLimit = number;
            } else {
                // A dict of bank and limit sets the named banks only.
                const auto words = Words(text);
                if (words.empty() || words.size() % 2 != 0)
                    return Refuse(state, message, Refusal::Value,
                                  "the sso limit is a whole number for every bank, or a dict of bank and number");
                for (std::size_t i = 0; i < words.size(); i += 2) {
                    auto bank = std::find_if(changed.device.banks.begin(), changed.device.banks.end(),
                                             [&](const Bank& b) { return b.name == words[i]; });
                    if (bank == changed.device.banks.end())
                        return Refuse(state, message, Refusal::Unknown, {"BANK", words[i]},
                                      Quote(words[i]) + " is no bank of the device");
                    if (!WholeNumber(words[i + 1], 0, kMaxCount, bank->ssoLimit))
                        return Refuse(state, message, Refusal::Value,
                                      "the sso limit of " + Quote(words[i]) +
                                          " must be a whole number of at least 0, not '" + words[i + 1] + "'");
                }
            }
            if (!Answer(FloorplanProperty(state, changed, key), result, message)) return 0;
            changed.modified = true;
            *plan = std::move(changed);
            state.Changed();
            return 1;
        });
    }

    RESULT block_properties(Out& result, Msg& message) override {
        return OnPlan(message, [&](ToolState&, FloorplanData& plan) -> RESULT {
            DictBuilder d;
            for (const Block& b : plan.constraints.blocks) d.Add(b.name, BlockValue(plan, b));
            return Answer(d.Take(), result, message);
        });
    }

    RESULT block_get(const Prop& block, const Str& name, Out& result, Msg& message) override {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            std::vector<std::string> names;
            if (!BlockNames(state, plan, block, names, message)) return 0;
            const std::string key = name.c_str();
            const bool builtIn =
                std::find(kBlockProperties.begin(), kBlockProperties.end(), key) != kBlockProperties.end();
            for (const std::string& n : names)
                if (!builtIn && !FindBlock(plan, n)->constraints.count(key))
                    return Refuse(state, message, Refusal::Unknown, {"PROPERTY", key},
                                  "block " + Quote(n) + " has no property or constraint " + Quote(key) +
                                      "; its properties are " + Join(kBlockProperties));
            auto valueOf = [&](const std::string& n) {
                const Block& b = *FindBlock(plan, n);
                return builtIn ? BlockProperty(plan, b, key) : NewText(b.constraints.at(key));
            };
            if (names.size() == 1) return Answer(valueOf(names.front()), result, message);
            DictBuilder several;
            for (const std::string& n : names) several.Add(n, valueOf(n));
            return Answer(several.Take(), result, message);
        });
    }

    RESULT block_set_constraint(const Prop& block, const Str& name, const Str& value, Out& result,
                                Msg& message) override {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            std::vector<std::string> names;
            if (!BlockNames(state, plan, block, names, message)) return 0;
            const std::string key = name.c_str(), text = value.c_str();
            if (std::string problem = CheckBlockConstraint(key, text); !problem.empty())
                return Refuse(state, message, Refusal::Value, problem);
            FloorplanConstraints changed = plan.constraints;
            for (Block& b : changed.blocks) {
                if (std::find(names.begin(), names.end(), b.name) == names.end()) continue;
                if (key == "region") {
                    Region r;
                    std::string ignored;
                    ParseRegion(text, r, ignored);
                    SetRegion(b, r);
                } else {
                    b.constraints[key] =
                        key == "capacity" ? std::to_string(*ParseCapacity(text)) : text;
                }
            }
            return AnswerBlocks(state, plan, std::move(changed), names, result, message);
        });
    }

    RESULT block_delete_constraint(const Prop& block, const Str& name, Out& result, Msg& message) override {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            std::vector<std::string> names;
            if (!BlockNames(state, plan, block, names, message)) return 0;
            const std::string key = name.c_str();
            FloorplanConstraints changed = plan.constraints;
            for (Block& b : changed.blocks) {
                if (std::find(names.begin(), names.end(), b.name) == names.end()) continue;
                const bool had = key == "region" ? RegionOf(b).has_value() : b.constraints.erase(key) > 0;
                if (!had)
                    return Refuse(state, message, Refusal::Unknown, {"CONSTRAINT", key},
                                  "block " + Quote(b.name) + " has no constraint " + Quote(key));
                if (key == "region") SetRegion(b, std::nullopt);
            }
            return AnswerBlocks(state, plan, std::move(changed), names, result, message);
        });
    }

    RESULT prohibit(const Prop& sites, Out& result, Msg& message) override {
        return SwitchSites(sites, true, result, message);
    }

    RESULT allow(const Prop& sites, Out& result, Msg& message) override {
        return SwitchSites(sites, false, result, message);
    }

    RESULT drc(Out& result, Msg& message) override { return Analyse(RunDrc, FindingValue, result, message); }

    RESULT sso_analysis(Out& result, Msg& message) override { return Analyse(RunSso, SsoBankValue, result, message); }

    RESULT clock_analysis(Out& result, Msg& message) override {
        return Analyse(RunClockAnalysis, ClockRegionValue, result, message);
    }

    RESULT make_pin_compatible(const Str& s1, const Str& s2, const Str& s3, const Str& s4, Out& result,
                               Msg& message) override {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            const auto from = Words(s1.c_str()), to = Words(s2.c_str()), offset = Words(s3.c_str());
            const std::string mode = s4.c_str();
            if (mode != "copy" && mode != "swap")
                return Refuse(state, message, Refusal::Value, "unknown mode '" + mode + "': use copy or swap");
            if (from.empty() || from.size() != to.size())
                return Refuse(state, message, Refusal::Value,
                              "the two port lists must be of the same length, and not empty");
            int dx = 0, dy = 0;
            if (!offset.empty() && (offset.size() != 2 || !WholeNumber(offset[0], -kMaxSide, kMaxSide, dx) ||
                                    !WholeNumber(offset[1], -kMaxSide, kMaxSide, dy)))
                return Refuse(state, message, Refusal::Value,
                              "the offset is two whole numbers \"dx dy\", not '" + std::string(s3.c_str()) + "'");
            if (mode == "swap" && (dx != 0 || dy != 0))
                return Refuse(state, message, Refusal::Value, "swap moves no pin by an offset: give \"0 0\"");
            const Design& design = *state.CurrentDesign();
            std::set<std::string> seen;
            for (const std::string& p : from) seen.insert(p);
            for (const std::string& p : to)
                if (!seen.insert(p).second)
                    return Refuse(state, message, Refusal::Value, "port " + Quote(p) + " is named twice");
            auto sites = plan.constraints.ports;
            DictBuilder moved;
            for (std::size_t i = 0; i < from.size(); ++i) {
                for (const std::string* p : {&from[i], &to[i]})
                    if (!design.FindPort(*p))
                        return Refuse(state, message, Refusal::Unknown, {"PORT", *p},
                                      Quote(*p) + " is no port of the design");
                const auto source = plan.constraints.ports.find(from[i]);
                if (source == plan.constraints.ports.end())
                    return Refuse(state, message, Refusal::Value, "port " + Quote(from[i]) + " is not placed");
                if (mode == "swap") {
                    const auto target = plan.constraints.ports.find(to[i]);
                    if (target == plan.constraints.ports.end())
                        return Refuse(state, message, Refusal::Value, "port " + Quote(to[i]) + " is not placed");
                    sites[to[i]] = source->second;
                    sites[from[i]] = target->second;
                    continue;
                }
                int x = 0, y = 0;
                ParseSiteName(source->second, x, y);
                if (!plan.device.OnDevice(x + dx, y + dy))
                    return Refuse(state, message, Refusal::Value,
                                  "port " + Quote(to[i]) + " would leave the device: " + source->second + " moved by " +
                                      std::to_string(dx) + " " + std::to_string(dy));
                sites[to[i]] = Device::SiteName(x + dx, y + dy);
            }
            std::map<std::string, std::string> holder;  // site -> port
            for (const auto& [port, site] : sites) {
                auto [it, fresh] = holder.emplace(site, port);
                if (!fresh)
                    return Refuse(
                        state, message, Refusal::Value,
                        "ports " + Quote(it->second) + " and " + Quote(port) + " would share the site " + site);
                const auto before = plan.constraints.ports.find(port);
                const bool changed = before == plan.constraints.ports.end() || before->second != site;
                if (changed && plan.constraints.prohibited.count(site))
                    return Refuse(state, message, Refusal::Value,
                                  "port " + Quote(port) + " would be placed on the prohibited site " + site);
                if (changed) moved.Add(port, site);
            }
            if (!Answer(moved.Take(), result, message)) return 0;
            plan.constraints.ports = std::move(sites);
            plan.modified = true;
            state.Changed();
            return 1;
        });
    }

    RESULT zoom(const Str& left, const Str& right, Out& result, Msg& message) override {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            const std::string a = left.c_str(), b = right.c_str();
            Region view;
            if (a == "fit") {
                view = WholeDevice(plan.device);
            } else if (a == "block") {
                const Block* block = FindBlock(plan, b);
                if (!block) return Refuse(state, message, Refusal::Unknown, {"BLOCK", b}, "no block named " + Quote(b));
                const auto region = RegionOf(*block);
                if (!region)
                    return Refuse(state, message, Refusal::Value, "block " + Quote(b) + " has no region to show");
                view = ClampToDevice(*region, plan.device);
            } else {
                const auto p = plan.device.ParseSite(a), q = plan.device.ParseSite(b);
                if (!p || !q)
                    return Refuse(state, message, Refusal::Value,
                                  "zoom needs two sites of the device, block NAME or fit, not '" + a + "' '" + b + "'");
                view = Region{std::min(p->x, q->x), std::min(p->y, q->y), std::max(p->x, q->x), std::max(p->y, q->y)};
            }
            if (!Answer(ViewValue(plan, view), result, message)) return 0;
            plan.view = view;
            return 1;
        });
    }

    RESULT refresh(Out& result, Msg& message) override {
        return OnPlan(message, [&](ToolState&, FloorplanData& plan) -> RESULT {
            // The device may have changed under the view; what no longer lies on it is dropped.
            Region view = ClampToDevice(plan.view, plan.device);
            if (!Answer(ViewValue(plan, view), result, message)) return 0;
            plan.view = view;
            return 1;
        });
    }

private:
    // Runs `op` on the open floorplan, when it belongs to the current design (Ready).
    template <class Op>
    RESULT OnPlan(Msg& message, Op op) {
        return m_state.On(message, [&](ToolState& state) -> RESULT {
            FloorplanData* plan = Ready(state, message);
            return plan ? op(state, *plan) : 0;
        });
    }

    static FloorplanData& Plan(ToolState& state) {
        if (!state.floorplan) state.floorplan = std::make_shared<FloorplanData>();
        return *state.floorplan;
    }

    // The open floorplan, when it belongs to the design that is current now.
    static FloorplanData* Ready(ToolState& state, Msg& message) {
        FloorplanData& plan = Plan(state);
        if (!plan.open) {
            Refuse(state, message, Refusal::State, kNotOpen);
            return nullptr;
        }
        if (!state.CurrentDesign()) {
            Refuse(state, message, Refusal::NoProject, kNoProject);
            return nullptr;
        }
        if (plan.epoch != state.designEpoch) {
            Refuse(state, message, Refusal::State,
                   "the design changed since the floorplan was opened: close it with -nosave and open it again");
            return nullptr;
        }
        return &plan;
    }

    // Answers with what `run` finds in the open floorplan, an item a dict as `value` makes it.
    template <class Run, class Value>
    RESULT Analyse(Run run, Value value, Out& result, Msg& message) {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            const auto items = run(*state.CurrentDesign(), plan);
            return Answer(ListOf(items, [&](const auto& item) { return value(item, plan); }), result, message);
        });
    }

    // Opens a floorplan made from the current design, once `prepare` has made it what the operation
    // opens; on any failure none is open.
    template <class Prepare>
    RESULT Opening(Out& result, Msg& message, Prepare prepare) {
        return m_state.On(message, [&](ToolState& state) -> RESULT {
            FloorplanData fresh;
            if (!Start(state, fresh, message) || !prepare(state, fresh)) return 0;
            return Install(state, std::move(fresh), result, message);
        });
    }

    // A floorplan made from the current design, when none is open yet.
    static bool Start(ToolState& state, FloorplanData& fresh, Msg& message) {
        if (Plan(state).open)
            return Refuse(state, message, Refusal::State, "the floorplan is open already: close it first") != 0;
        const Design* design = state.CurrentDesign();
        if (!design) return Refuse(state, message, Refusal::NoProject, kNoProject) != 0;
        fresh.open = true;
        fresh.epoch = state.designEpoch;
        auto name = design->properties.find(kNameKey);
        fresh.name = name != design->properties.end() ? name->second : design->name;
        fresh.device = design->device;
        fresh.constraints.blocks = design->blocks;
        fresh.constraints.prohibited = design->prohibited;
        for (const IoPort& p : design->ports)
            if (!p.site.empty()) fresh.constraints.ports[p.name] = p.site;
        if (auto limit = design->properties.find(kClockLimitKey); limit != design->properties.end())
            WholeNumber(limit->second, 0, kMaxCount, fresh.clockLimit);
        fresh.view = WholeDevice(fresh.device);
        return true;
    }

    static RESULT Install(ToolState& state, FloorplanData fresh, Out& result, Msg& message) {
        if (!Answer(FloorplanValue(state, fresh), result, message)) return 0;
        Plan(state) = std::move(fresh);
        state.Changed();
        return 1;
    }

    // What a save wrote: the project file and the number of its values changed, added or removed.
    struct Saved {
        std::string file;
        std::size_t changed = 0;
    };

    // Writes the design with the working copy in it to the project file, and then makes it the
    // project's design; on any failure the file, the design and the floorplan are as they were.
    static bool Commit(ToolState& state, Saved& saved, Msg& message) {
        FloorplanData* plan = Ready(state, message);
        if (!plan) return false;
        ProjectComponent* project = state.Current();
        for (const Block& b : plan->constraints.blocks)
            if (auto r = RegionOf(b);
                r && !(plan->device.OnDevice(r->x0, r->y0) && plan->device.OnDevice(r->x1, r->y1)))
                return Refuse(state, message, Refusal::Value,
                              "the floorplan cannot be saved: block " + Quote(b.name) + " has the region " +
                                  RegionText(*r) + ", which reaches beyond the device") != 0;
        const Design& before = *project->GetDesign();
        Design design = before;
        design.device = plan->device;
        design.blocks = plan->constraints.blocks;
        design.prohibited = plan->constraints.prohibited;
        bool moved = before.device.name != design.device.name || before.device.columns != design.device.columns ||
                     before.device.rows != design.device.rows;
        for (IoPort& p : design.ports) {
            auto it = plan->constraints.ports.find(p.name);
            const std::string site = it == plan->constraints.ports.end() ? std::string() : it->second;
            moved = moved || site != p.site;
            p.site = site;
        }
        if (plan->name != design.name)
            design.properties[kNameKey] = plan->name;
        else
            design.properties.erase(kNameKey);
        if (plan->clockLimit > 0)
            design.properties[kClockLimitKey] = std::to_string(plan->clockLimit);
        else
            design.properties.erase(kClockLimitKey);
        if (std::string problem = design.Index(); !problem.empty())
            return Refuse(state, message, Refusal::Value, "the floorplan cannot be saved: " + problem) != 0;
        if (std::string problem; !project->Store(std::move(design), saved.changed, problem))
            return Refuse(state, message, Refusal::File, {project->File()},
                          "the floorplan cannot be saved: " + problem) != 0;
        saved.file = project->File();
        if (moved) state.DesignChanged();
        plan->epoch = state.designEpoch;
        plan->modified = false;
        state.Changed();
        return true;
    }

    static std::vector<std::pair<ConstraintForm, std::string>> Files(const Str& ucf, const Str& csv, const Str& vhdl,
                                                                     const Str& vlog) {
        std::vector<std::pair<ConstraintForm, std::string>> files;
        const std::pair<ConstraintForm, const Str*> given[] = {{ConstraintForm::Ucf, &ucf},
                                                               {ConstraintForm::Csv, &csv},
                                                               {ConstraintForm::Vhdl, &vhdl},
                                                               {ConstraintForm::Vlog, &vlog}};
        for (const auto& [form, file] : given)
            if (!file->IsEmpty()) files.emplace_back(form, file->c_str());
        return files;
    }

    static RESULT Unknown(const ToolState& state, const std::string& key, Msg& message) {
        return Refuse(state, message, Refusal::Unknown, {"SETTING", key},
                      "no floorplan setting '" + key + "'; the settings are: open, " + Join(kFloorplanProperties));
    }

    static const Block* FindBlock(const FloorplanData& plan, const std::string& name) {
        for (const Block& b : plan.constraints.blocks)
            if (b.name == name) return &b;
        return nullptr;
    }

    static bool BlockNames(const ToolState& state, const FloorplanData& plan, const Prop& value,
                           std::vector<std::string>& names, Msg& message) {
        if (!WordsOf(value, names)) return Refuse(state, message, Refusal::Value, "the blocks are no proper list") != 0;
        if (names.empty()) return Refuse(state, message, Refusal::Value, "no block given") != 0;
        for (const std::string& n : names)
            if (!FindBlock(plan, n)) {
                const auto all = BlockList(plan.constraints);
                return Refuse(state, message, Refusal::Unknown, {"BLOCK", n},
                              "no block named " + Quote(n) +
                                  (all.empty() ? std::string("; the floorplan has no blocks")
                                               : "; the blocks are: " + Join(all))) != 0;
            }
        return true;
    }

    static void Keep(ToolState& state, FloorplanData& plan, FloorplanConstraints changed) {
        plan.constraints = std::move(changed);
        plan.modified = true;
        state.Changed();
    }

    static RESULT AnswerBlocks(ToolState& state, FloorplanData& plan, FloorplanConstraints changed,
                               const std::vector<std::string>& names, Out& result, Msg& message) {
        FloorplanData preview = plan;
        preview.constraints = changed;
        Tcl_Obj* answer = nullptr;
        if (names.size() == 1) {
            answer = BlockValue(preview, *FindBlock(preview, names.front()));
        } else {
            DictBuilder d;
            for (const std::string& n : names) d.Add(n, BlockValue(preview, *FindBlock(preview, n)));
            answer = d.Take();
        }
        if (!Answer(answer, result, message)) return 0;
        Keep(state, plan, std::move(changed));
        return 1;
    }

    RESULT SwitchSites(const Prop& sites, bool prohibit, Out& result, Msg& message) {
        return OnPlan(message, [&](ToolState& state, FloorplanData& plan) -> RESULT {
            std::vector<std::string> words;
            if (!WordsOf(sites, words)) return Refuse(state, message, Refusal::Value, "the sites are no proper list");
            if (words.empty()) return Refuse(state, message, Refusal::Value, "no site given");
            std::set<std::string> changed = plan.constraints.prohibited;
            for (const std::string& w : words) {
                Region r;
                std::string error;
                const bool range = w.find(':') != std::string::npos;
                int x = 0, y = 0;
                if (range ? !ParseRegion(w, r, error) : !ParseSiteName(w, x, y))
                    return Refuse(state, message, Refusal::Value,
                                  Quote(w) + " is no site: give X<col>Y<row> or a range X0Y0:X1Y1");
                if (!range) r = Region{x, y, x, y};
                if (!plan.device.OnDevice(r.x0, r.y0) || !plan.device.OnDevice(r.x1, r.y1))
                    return Refuse(state, message, Refusal::Value,
                                  Quote(w) + " is not on the device (" + std::to_string(plan.device.columns) + " x " +
                                      std::to_string(plan.device.rows) + " sites)");
                if (!prohibit) {
                    // A walk over what is prohibited, not over the range, which may be huge.
                    std::erase_if(changed, [&r](const std::string& site) {
                        int sx = 0, sy = 0;
                        return ParseSiteName(site, sx, sy) && r.Contains(sx, sy);
                    });
                    continue;
                }
                if (r.Sites() > kMaxProhibited)
                    return Refuse(state, message, Refusal::Limit,
                                  Quote(w) + " covers " + std::to_string(r.Sites()) +
                                      " sites; a floorplan prohibits at most " + std::to_string(kMaxProhibited) +
                                      " sites");
                for (int yy = r.y0; yy <= r.y1; ++yy)
                    for (int xx = r.x0; xx <= r.x1; ++xx) changed.insert(Device::SiteName(xx, yy));
                if (static_cast<long long>(changed.size()) > kMaxProhibited)
                    return Refuse(state, message, Refusal::Limit,
                                  "the floorplan would prohibit " + std::to_string(changed.size()) +
                                      " sites, more than " + std::to_string(kMaxProhibited));
            }
            if (!Answer(NewList(SiteOrder(changed)), result, message)) return 0;
            plan.constraints.prohibited = std::move(changed);
            plan.modified = true;
            state.Changed();
            return 1;
        });
    }

    WeakState m_state;
};

}  // namespace

TcltaskI::IXFloorplan* NewFloorplan(const StatePtr& state) { return new Floorplan(state); }

}  // namespace kelmartool
