// Reading and writing a design as JSON. The file:
//
//   { "design": NAME,
//     "device": { "name": N, "columns": C, "rows": R, "site_capacity": 1,
//                 "banks": [ { "name": B, "sites": "X0Y0:X3Y7", "sso_limit": 8 } ] },
//     "clocks": [ { "name": N, "period": 10.0, "net": NET } ],
//     "ports":  [ { "name": N, "direction": "in"|"out", "site": "X0Y3", "standard": "LVCMOS33" } ],
//     "cells":  [ { "name": N, "type": "LUT", "site": "X1Y1", "delay": 0.4,
//                   "sequential": false, "setup": 0.1, "clock": CLOCK } ],
//     "nets":   [ { "name": N, "driver": CELL_OR_PORT, "loads": [ ... ], "delay": 0.2 } ],
//     "floorplan": { "blocks": [ { "name": B, "cells": [ ... ], "region": "X0Y0:X3Y3",
//                                  "constraints": { ... } } ],
//                    "prohibited": [ "X2Y2" ] },
//     "properties": { ... } }
//
// Every object may carry "properties", an object of strings. Only "design" and "device" are
// required; "sequential" defaults to true for the type FF.
#include <cstdint>
#include <cstdio>
#include <utility>

#include <nlohmann/json.hpp>

#include "design.h"
#include "file_io.h"
#include "json_edit.h"
#include "json_shown.h"

namespace kelmartool {

namespace {

using nlohmann::ordered_json;

// A field that is not what it should be; the text names the field by its path and its value.
struct BadField {
    std::string text;
};


class Reader {
public:
    explicit Reader(const ordered_json& node, std::string path) : m_node(node), m_path(std::move(path)) {}

    bool Has(const char* key) const { return m_node.contains(key) && !m_node.at(key).is_null(); }

    std::string Text(const char* key, bool required = false, const std::string& fallback = {}) const {
        if (!Has(key)) return Missing(key, required, fallback);
        const auto& v = m_node.at(key);
        if (!v.is_string()) Bad(key, "must be a string");
        return v.get<std::string>();
    }
    // A time in ns; the parser gives only finite numbers, the upper bound keeps sums of them finite.
    double Time(const char* key) const {
        if (!Has(key)) return 0;
        const auto& v = m_node.at(key);
        if (!v.is_number()) Bad(key, "must be a number");
        const double time = v.get<double>();
        if (time > kMaxTime) Bad(key, "must be a number of at most " + std::to_string(static_cast<long long>(kMaxTime)));
        return time;
    }
    int Integer(const char* key, int low, int high, bool required = false, int fallback = 0) const {
        if (!Has(key)) {
            if (required) throw BadField{Path(key) + " is missing"};
            return fallback;
        }
        const auto& v = m_node.at(key);
        // Compared before any narrowing; the parser gives a number without a sign as unsigned.
        const auto inRange = [low, high](auto n) { return std::cmp_greater_equal(n, low) && std::cmp_less_equal(n, high); };
        const bool fits = v.is_number_unsigned()  ? inRange(v.get<std::uint64_t>())
                          : v.is_number_integer() ? inRange(v.get<std::int64_t>())
                                                  : false;
        if (!fits)
            Bad(key, "must be a whole number from " + std::to_string(low) + " to " + std::to_string(high));
        return static_cast<int>(v.get<std::int64_t>());
    }
    bool Flag(const char* key, bool fallback) const {
        if (!Has(key)) return fallback;
        const auto& v = m_node.at(key);
        if (!v.is_boolean()) Bad(key, "must be true or false");
        return v.get<bool>();
    }
    std::vector<std::string> Words(const char* key) const {
        std::vector<std::string> out;
        if (!Has(key)) return out;
        const auto& v = m_node.at(key);
        if (!v.is_array()) Bad(key, "must be a list of names");
        for (std::size_t i = 0; i < v.size(); ++i) {
            if (!v[i].is_string())
                throw BadField{Path(key) + "[" + std::to_string(i) + "] must be a string, not " + Shown(v[i])};
            out.push_back(v[i].get<std::string>());
        }
        return out;
    }
    Properties Props(const char* key = "properties") const {
        Properties out;
        if (!Has(key)) return out;
        const auto& v = m_node.at(key);
        if (!v.is_object()) Bad(key, "must be an object");
        for (const auto& [k, value] : v.items()) {
            if (value.is_string())
                out[k] = value.get<std::string>();
            else if (value.is_primitive())
                out[k] = value.dump();
            else
                throw BadField{Path(key) + "." + k + " must be a plain value, not " + Shown(value)};
        }
        return out;
    }
    // The elements of a list of objects, each with its path.
    std::vector<Reader> Items(const char* key, std::size_t most = SIZE_MAX) const {
        std::vector<Reader> out;
        if (!Has(key)) return out;
        const auto& v = m_node.at(key);
        if (!v.is_array()) Bad(key, "must be a list");
        if (v.size() > most) throw BadField{Path(key) + " holds " + std::to_string(v.size()) + " items, more than " +
                                            std::to_string(most)};
        for (std::size_t i = 0; i < v.size(); ++i) {
            std::string path = Path(key) + "[" + std::to_string(i) + "]";
            if (!v[i].is_object()) throw BadField{path + " must be an object, not " + Shown(v[i])};
            out.emplace_back(v[i], std::move(path));
        }
        return out;
    }
    Reader Child(const char* key, bool required) const {
        static const ordered_json empty = ordered_json::object();
        if (!Has(key)) {
            if (required) throw BadField{Path(key) + " is missing"};
            return Reader(empty, Path(key));
        }
        const auto& v = m_node.at(key);
        if (!v.is_object()) Bad(key, "must be an object");
        return Reader(v, Path(key));
    }
    std::string Path(const char* key) const { return m_path.empty() ? key : m_path + "." + key; }

private:
    std::string Missing(const char* key, bool required, const std::string& fallback) const {
        if (required) throw BadField{Path(key) + " is missing"};
        return fallback;
    }
    [[noreturn]] void Bad(const char* key, const std::string& what) const {
        throw BadField{Path(key) + " " + what + ", not " + Shown(m_node.at(key))};
    }

    const ordered_json& m_node;
    std::string m_path;
};

// "X0Y0:X3Y7" on a device of the given size.
void ParseRange(const Device& device, const std::string& text, const std::string& path, int& x0, int& y0, int& x1,
                int& y1) {
    const auto colon = text.find(':');
    auto a = device.ParseSite(text.substr(0, colon));
    auto b = colon == std::string::npos ? a : device.ParseSite(text.substr(colon + 1));
    if (!a || !b) throw BadField{path + " must be a range of sites of the device like X0Y0:X3Y3, not '" + text + "'"};
    x0 = std::min(a->x, b->x);
    y0 = std::min(a->y, b->y);
    x1 = std::max(a->x, b->x);
    y1 = std::max(a->y, b->y);
}

std::string RangeText(int x0, int y0, int x1, int y1) {
    return Device::SiteName(x0, y0) + ":" + Device::SiteName(x1, y1);
}

std::unique_ptr<Design> Build(const ordered_json& root) {
    if (!root.is_object()) throw BadField{"the top level must be an object"};
    Reader top(root, "");
    auto design = std::make_unique<Design>();
    design->name = top.Text("design", true);
    design->properties = top.Props();

    Reader dev = top.Child("device", true);
    Device& device = design->device;
    device.name = dev.Text("name", false, "device");
    device.columns = dev.Integer("columns", 1, kMaxSide, true);
    device.rows = dev.Integer("rows", 1, kMaxSide, true);
    device.siteCapacity = dev.Integer("site_capacity", 1, kMaxCount, false, 1);
    for (const Reader& r : dev.Items("banks", kMaxBanks)) {
        Bank b;
        b.name = r.Text("name", true);
        ParseRange(device, r.Text("sites", true), r.Path("sites"), b.x0, b.y0, b.x1, b.y1);
        b.ssoLimit = r.Integer("sso_limit", 0, kMaxCount);
        device.banks.push_back(std::move(b));
    }
    for (const Reader& r : top.Items("clocks")) {
        Clock c;
        c.name = r.Text("name", true);
        c.period = r.Time("period");
        c.net = r.Text("net");
        c.properties = r.Props();
        design->clocks.push_back(std::move(c));
    }
    for (const Reader& r : top.Items("ports")) {
        IoPort p;
        p.name = r.Text("name", true);
        const std::string direction = r.Text("direction", true);
        if (direction != "in" && direction != "out")
            throw BadField{r.Path("direction") + " must be in or out, not " + Shown(direction)};
        p.output = direction == "out";
        p.site = r.Text("site");
        p.standard = r.Text("standard");
        p.properties = r.Props();
        design->ports.push_back(std::move(p));
    }
    for (const Reader& r : top.Items("cells")) {
        Cell c;
        c.name = r.Text("name", true);
        c.type = r.Text("type", true);
        c.site = r.Text("site");
        c.delay = r.Time("delay");
        c.setup = r.Time("setup");
        c.sequential = r.Flag("sequential", c.type == "FF");
        c.clock = r.Text("clock");
        c.properties = r.Props();
        design->cells.push_back(std::move(c));
    }
    for (const Reader& r : top.Items("nets")) {
        Net n;
        n.name = r.Text("name", true);
        n.driver = r.Text("driver", true);
        n.loads = r.Words("loads");
        n.delay = r.Time("delay");
        n.properties = r.Props();
        design->nets.push_back(std::move(n));
    }
    Reader plan = top.Child("floorplan", false);
    for (const Reader& r : plan.Items("blocks")) {
        Block b;
        b.name = r.Text("name", true);
        b.cells = r.Words("cells");
        if (r.Has("region")) {
            int x0, y0, x1, y1;
            ParseRange(device, r.Text("region"), r.Path("region"), x0, y0, x1, y1);
            b.x0 = x0, b.y0 = y0, b.x1 = x1, b.y1 = y1;
        }
        b.constraints = r.Props("constraints");
        design->blocks.push_back(std::move(b));
    }
    for (std::string& site : plan.Words("prohibited")) design->prohibited.insert(std::move(site));

    if (std::string problem = design->Index(); !problem.empty()) throw BadField{problem};
    return design;
}

ordered_json PropsJson(const Properties& p) {
    ordered_json out = ordered_json::object();
    for (const auto& [k, v] : p) out[k] = v;
    return out;
}

// Follows a parse of JSON text to name the field where it fails: the path of the value being read
// when the parser gave up. Only run once a parse has failed, so it keeps no values.
class WhereItFails final : public nlohmann::json_sax<ordered_json> {
public:
    std::string path;
    std::string token;  // the text the parser stopped at
    int id = 0;         // nlohmann's number of the failure

    bool null() override { return Value(); }
    bool boolean(bool) override { return Value(); }
    bool number_integer(number_integer_t) override { return Value(); }
    bool number_unsigned(number_unsigned_t) override { return Value(); }
    bool number_float(number_float_t, const string_t&) override { return Value(); }
    bool string(string_t&) override { return Value(); }
    bool binary(binary_t&) override { return Value(); }
    bool start_object(std::size_t) override { return Open(false); }
    bool key(string_t& name) override {
        m_levels.back().key = name;
        return true;
    }
    bool end_object() override { return Close(); }
    bool start_array(std::size_t) override { return Open(true); }
    bool end_array() override { return Close(); }
    bool parse_error(std::size_t, const std::string& last, const nlohmann::json::exception& failure) override {
        token = last;
        id = failure.id;
        for (const Level& level : m_levels) {
            if (level.array)
                path += "[" + std::to_string(level.index) + "]";
            else if (!level.key.empty())
                path += (path.empty() ? "" : ".") + level.key;
        }
        return false;
    }

private:
    struct Level {
        bool array = false;
        std::size_t index = 0;  // of the element being read, in an array
        std::string key;        // of the member being read, in an object
    };
    bool Open(bool array) {
        m_levels.push_back(Level{array, 0, {}});
        return true;
    }
    bool Close() {
        m_levels.pop_back();
        return Value();
    }
    bool Value() {
        if (!m_levels.empty() && m_levels.back().array) ++m_levels.back().index;
        return true;
    }
    std::vector<Level> m_levels;
};

// The length of the valid UTF-8 sequence that starts at `text[at]`, or 0: no overlong forms, no
// surrogates (Tcl's encoding of a NUL and of a lone surrogate are both refused), nothing beyond
// U+10FFFF.
std::size_t Utf8Length(std::string_view text, std::size_t at) {
    const auto byte = [&](std::size_t i) { return static_cast<unsigned char>(text[i]); };
    const unsigned char lead = byte(at);
    if (lead < 0x80) return 1;
    std::size_t length = 0;
    std::uint32_t code = 0;
    if (lead >= 0xC2 && lead <= 0xDF)
        length = 2, code = lead & 0x1Fu;
    else if ((lead & 0xF0) == 0xE0)
        length = 3, code = lead & 0x0Fu;
    else if (lead >= 0xF0 && lead <= 0xF4)
        length = 4, code = lead & 0x07u;
    else
        return 0;
    if (at + length > text.size()) return 0;
    for (std::size_t i = 1; i < length; ++i) {
        if ((byte(at + i) & 0xC0) != 0x80) return 0;
        code = code << 6 | (byte(at + i) & 0x3Fu);
    }
    if (length == 3 && (code < 0x800 || (code >= 0xD800 && code <= 0xDFFF))) return 0;
    if (length == 4 && (code < 0x10000 || code > 0x10FFFF)) return 0;
    return length;
}

// Whether the text can go into a JSON file; else `shown` is the text with its bad bytes as \xHH.
bool WritableText(std::string_view text, std::string& shown) {
    bool writable = true;
    shown.clear();
    for (std::size_t at = 0; at < text.size();) {
        const std::size_t length = Utf8Length(text, at);
        if (length == 0) {
            char escaped[5];
            std::snprintf(escaped, sizeof escaped, "\\x%02X", static_cast<unsigned char>(text[at]));
            shown += escaped;
            writable = false;
            ++at;
        } else {
            shown.append(text, at, length);
            at += length;
        }
    }
    return writable;
}

// The first name or text of `node` that cannot be written, by its path; empty when all can.
std::string Unwritable(const ordered_json& node, const std::string& path) {
    std::string shown;
    if (node.is_string()) {
        if (WritableText(node.get_ref<const std::string&>(), shown)) return {};
        return (path.empty() ? std::string("the design") : path) + " is no valid UTF-8 text (a NUL or a lone surrogate " +
               "cannot be written): \"" + shown + "\"";
    }
    if (node.is_array()) {
        for (std::size_t i = 0; i < node.size(); ++i)
            if (std::string bad = Unwritable(node[i], path + "[" + std::to_string(i) + "]"); !bad.empty()) return bad;
    } else if (node.is_object()) {
        for (const auto& [key, value] : node.items()) {
            const std::string inner = path.empty() ? key : path + "." + key;
            if (!WritableText(key, shown))
                return (path.empty() ? std::string("the design") : path) +
                       " has a name that is no valid UTF-8 text: \"" + shown + "\"";
            if (std::string bad = Unwritable(value, inner); !bad.empty()) return bad;
        }
    }
    return {};
}

}  // namespace

std::unique_ptr<Design> ParseDesign(const std::string& text, std::string& error) {
    ordered_json root;
    try {
        root = ordered_json::parse(text);
    } catch (const nlohmann::json::parse_error& e) {
        error = std::string("it is not valid JSON (") + e.what() + ")";
        return nullptr;
    } catch (const nlohmann::json::exception& e) {
        // Beyond syntax the parser refuses only a number too large for a double: read again to
        // name its field.
        WhereItFails where;
        ordered_json::sax_parse(text, &where);
        if (where.id != e.id) error = e.what();
        else error = (where.path.empty() ? std::string("the design") : where.path) + " holds the number " + where.token +
                ", which is too large";
        return nullptr;
    }
    try {
        return Build(root);
    } catch (const BadField& bad) {
        error = bad.text;
    } catch (const std::exception& e) {
        error = e.what();
    }
    return nullptr;
}

std::unique_ptr<Design> ReadDesign(const std::string& file, std::string& text, std::string& error) {
    std::string content, why;
    if (!ReadTextFile(file, content, why)) {
        error = "cannot read the project file '" + file + "': " + why;
        return nullptr;
    }
    std::string problem;
    auto design = ParseDesign(content, problem);
    if (!design) error = "the project file '" + file + "' is malformed: " + problem;
    else text = std::move(content);
    return design;
}

namespace {

// The design as the tree the file holds: every field in the order of the file's description above,
// defaults left out where the reader fills them in.
ordered_json Tree(const Design& d) {
    ordered_json root = ordered_json::object();
    root["design"] = d.name;
    ordered_json device = ordered_json::object();
    device["name"] = d.device.name;
    device["columns"] = d.device.columns;
    device["rows"] = d.device.rows;
    device["site_capacity"] = d.device.siteCapacity;
    device["banks"] = ordered_json::array();
    for (const Bank& b : d.device.banks)
        device["banks"].push_back({{"name", b.name}, {"sites", RangeText(b.x0, b.y0, b.x1, b.y1)}, {"sso_limit", b.ssoLimit}});
    root["device"] = std::move(device);
    auto withProps = [](ordered_json obj, const Properties& p) {
        if (!p.empty()) obj["properties"] = PropsJson(p);
        return obj;
    };
    root["clocks"] = ordered_json::array();
    for (const Clock& c : d.clocks)
        root["clocks"].push_back(withProps({{"name", c.name}, {"period", c.period}, {"net", c.net}}, c.properties));
    root["ports"] = ordered_json::array();
    for (const IoPort& p : d.ports)
        root["ports"].push_back(withProps(
            {{"name", p.name}, {"direction", p.output ? "out" : "in"}, {"site", p.site}, {"standard", p.standard}},
            p.properties));
    root["cells"] = ordered_json::array();
    for (const Cell& c : d.cells) {
        ordered_json cell = {{"name", c.name}, {"type", c.type}, {"site", c.site}, {"delay", c.delay}};
        if (c.sequential != (c.type == "FF")) cell["sequential"] = c.sequential;
        if (c.sequential) {
            cell["setup"] = c.setup;
            cell["clock"] = c.clock;
        }
        root["cells"].push_back(withProps(std::move(cell), c.properties));
    }
    root["nets"] = ordered_json::array();
    for (const Net& n : d.nets)
        root["nets"].push_back(
            withProps({{"name", n.name}, {"driver", n.driver}, {"loads", n.loads}, {"delay", n.delay}}, n.properties));
    if (!d.blocks.empty() || !d.prohibited.empty()) {
        ordered_json plan = ordered_json::object();
        plan["blocks"] = ordered_json::array();
        for (const Block& b : d.blocks) {
            ordered_json block = {{"name", b.name}, {"cells", b.cells}};
            if (b.x0 && b.y0 && b.x1 && b.y1) block["region"] = RangeText(*b.x0, *b.y0, *b.x1, *b.y1);
            if (!b.constraints.empty()) block["constraints"] = PropsJson(b.constraints);
            plan["blocks"].push_back(std::move(block));
        }
        plan["prohibited"] = ordered_json::array();
        for (const std::string& s : d.prohibited) plan["prohibited"].push_back(s);
        root["floorplan"] = std::move(plan);
    }
    if (!d.properties.empty()) root["properties"] = PropsJson(d.properties);
    return root;
}

// The text of `wanted` made whole, two spaces an indentation level.
bool WholeText(const ordered_json& wanted, std::string& text, std::string& error) {
    // Checked before the dump, which would throw on the first bad byte without saying where.
    if (error = Unwritable(wanted, ""); !error.empty()) return false;
    try {
        text = wanted.dump(2) + "\n";
    } catch (const std::exception& e) {
        error = e.what();
        return false;
    }
    return true;
}

// The text of `design` made from `source`, the text it was read from, by changing in place only
// the values that differ (json_edit.h). The result is read back: should it not give the design,
// the design is written whole instead, for a file that holds the design comes before its layout.
bool EditedText(const std::string& source, const Design& design, DesignWrite& done, std::string& error) {
    const ordered_json wanted = Tree(design);
    if (error = Unwritable(wanted, ""); !error.empty()) return false;
    std::string problem;
    const auto before = ParseDesign(source, problem);
    if (!before) {
        error = "its former text cannot be read again: " + problem;
        return false;
    }
    try {
        done.changed = EditJson(source, Tree(*before), wanted, done.text);
    } catch (const std::exception& e) {
        error = e.what();
        return false;
    }
    const auto back = ParseDesign(done.text, problem);
    return (back && Tree(*back) == wanted) || WholeText(wanted, done.text, error);
}

}  // namespace

bool FormatDesign(const Design& d, std::string& text, std::string& error) { return WholeText(Tree(d), text, error); }

bool WriteDesign(const Design& design, const std::string& file, const std::string& source, DesignWrite& done,
                 std::string& error) {
    DesignWrite made;
    std::string why, current;
    const bool formatted =
        source.empty() ? FormatDesign(design, made.text, why) : EditedText(source, design, made, why);
    if (formatted) {
        // A file that holds the text already is left alone, its time of change included.
        made.written = !ReadTextFile(file, current, why) || current != made.text;
        if (!made.written || WriteTextFile(file, made.text, why)) {
            done = std::move(made);
            return true;
        }
    }
    error = "cannot write the project file '" + file + "': " + why;
    return false;
}

}  // namespace kelmartool
