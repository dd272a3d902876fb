// Reading a JSON netlist as `write_json` writes it:
//
//   { "modules": { NAME: { "attributes": { "top": "1" },
//                          "ports": { P: { "direction": "input"|"output"|"inout", "bits": [ 2, 3 ] } },
//                          "cells": { C: { "type": T, "parameters": { ... },
//                                          "port_directions": { PIN: "input"|"output" },
//                                          "connections": { PIN: [ 4, "0" ] } } },
//                          "netnames": { N: { "hide_name": 0, "bits": [ 2, 3 ] } } } } }
//
// A bit is a number, shared by everything it connects inside one module, or a constant "0", "1",
// "x" or "z". A cell whose type is a module of the file is an instance: the netlist is flattened
// from the top module, an instance's port bits joined to the bits its parent connects, so that a
// net of the design is a class of joined bits. The design gets one net per class with a driver,
// named after the best name its bits carry: a visible name before a hidden one (`$...`), a name of
// an outer module before an inner one.
#include <algorithm>
#include <set>
#include <utility>

#include <nlohmann/json.hpp>

#include "json_shown.h"
#include "netlist.h"

namespace kelmartool {

namespace {

using json = nlohmann::ordered_json;

// A field of the netlist that cannot be imported: the path to it and why.
struct Refused {
    std::string text;
};


// A member that must be an object; an absent one reads as empty when `required` is false.
const json& Object(const json& node, const char* key, const std::string& path, bool required) {
    static const json empty = json::object();
    const auto it = node.find(key);
    if (it == node.end() || it->is_null()) {
        if (required) throw Refused{path + "." + key + " is missing"};
        return empty;
    }
    if (!it->is_object()) throw Refused{path + "." + key + " must be an object, not " + Shown(*it)};
    return *it;
}

const json& List(const json& node, const char* key, const std::string& path) {
    const auto it = node.find(key);
    if (it == node.end()) throw Refused{path + "." + key + " is missing"};
    if (!it->is_array()) throw Refused{path + "." + key + " must be a list of bits, not " + Shown(*it)};
    return *it;
}

std::string Text(const json& node, const char* key, const std::string& path) {
    const auto it = node.find(key);
    if (it == node.end()) throw Refused{path + "." + key + " is missing"};
    if (!it->is_string()) throw Refused{path + "." + key + " must be a string, not " + Shown(*it)};
    return it->get<std::string>();
}

// An attribute or parameter that is set: a number other than 0, or a string of binary digits with a 1.
bool IsSet(const json& attributes, const char* key) {
    const auto it = attributes.find(key);
    if (it == attributes.end()) return false;
    if (it->is_number()) return it->get<double>() != 0;
    if (it->is_string()) return it->get<std::string>().find('1') != std::string::npos;
    return false;
}

// The name of bit `i` of a `width`-bit port or wire, with the file's numbering of its bits.
std::string BitName(const std::string& name, const json& node, std::size_t i, std::size_t width) {
    if (width == 1) return name;
    long long offset = 0;
    if (const auto it = node.find("offset"); it != node.end() && it->is_number_integer()) offset = it->get<long long>();
    const bool upto = IsSet(node, "upto");
    const long long index = offset + static_cast<long long>(upto ? width - 1 - i : i);
    return name + "[" + std::to_string(index) + "]";
}

// What the tool knows of a cell type of its own: which pins drive, which pin clocks it.
struct TypeInfo {
    CellKind kind = CellKind::Other;
    std::vector<std::string> outputs;
    std::string clockPin;  // for a sequential type
    bool known = false;
};

TypeInfo KnownType(const std::string& type) {
    const auto starts = [&](const char* prefix) { return type.starts_with(prefix); };
    if (type == "$lut") return {CellKind::Lut, {"Y"}, "", true};
    if (starts("$_DFF") || starts("$_SDFF") || starts("$_ALDFF") || starts("$_DFFSR"))
        return {CellKind::Ff, {"Q"}, "C", true};
    if (starts("$_DLATCH")) return {CellKind::Ff, {"Q"}, "E", true};
    if (starts("$_") && type.ends_with("_")) return {CellKind::Gate, {"Y"}, "", true};
    if (type == "SB_LUT4") return {CellKind::Lut, {"O"}, "", true};
    if (type == "SB_CARRY") return {CellKind::Carry, {"CO"}, "", true};
    if (starts("SB_DFF")) return {CellKind::Ff, {"Q"}, "C", true};
    if (starts("SB_RAM40_4K"))
        return {CellKind::Ram, {"RDATA"}, type.find("NR") != std::string::npos ? "RCLKN" : "RCLK", true};
    return {};
}

// Nodes 0, 1 and 2 are the constants 0, 1 and x (z is read as x); every other node is a bit.
constexpr int kConstants = 3;
// Instances nested deeper than this are refused before the recursion could exhaust the stack (a
// frame of the flattening takes kilobytes under the sanitizers); real hierarchies are a few dozen deep.
constexpr std::size_t kMaxDepth = 100;
constexpr const char* kConstantWords[kConstants] = {"0", "1", "x"};

class Importer {
public:
    Importer(const json& root, const NetlistOptions& options) : m_options(options) {
        if (!root.is_object()) throw Refused{"the top level must be an object, not " + Shown(root)};
        m_modules = &Object(root, "modules", "netlist", true);
        for (int i = 0; i < kConstants; ++i) m_parent.push_back(i);
        m_names.resize(kConstants);
    }

    std::unique_ptr<Design> Run() {
        const std::string top = Top();
        std::map<long long, int> bits;
        m_design = std::make_unique<Design>();
        m_design->name = top;
        std::vector<std::string> stack;
        Instantiate(top, "", bits, true, stack);
        Build();
        return std::move(m_design);
    }

private:
    struct PinBit {
        std::string pin;  // the pin, with [i] for a bit of a wide pin
        int node;
        bool output;
    };
    struct RawCell {
        std::string name, type;
        TypeInfo info;
        Properties properties;
        std::vector<PinBit> pins;
    };
    struct RawPort {
        std::string name;
        bool output;
        int node;
    };
    struct NameChoice {
        std::string name;
        int rank = -1;  // lower is better; -1: no name yet
    };

    std::string Top() const {
        if (!m_options.top.empty()) {
            if (!m_modules->contains(m_options.top))
                throw Refused{"the top module '" + m_options.top + "' is no module of netlist.modules (" + ModuleList() +
                              ")"};
            return m_options.top;
        }
        std::vector<std::string> marked;
        for (const auto& [name, module] : m_modules->items()) {
            if (!module.is_object()) throw Refused{"netlist.modules." + name + " must be an object, not " + Shown(module)};
            if (IsSet(Object(module, "attributes", "netlist.modules." + name, false), "top")) marked.push_back(name);
        }
        if (marked.size() == 1) return marked.front();
        if (marked.empty())
            throw Refused{"no module of netlist.modules is marked top: name one with -top (" + ModuleList() + ")"};
        throw Refused{"modules '" + marked[0] + "' and '" + marked[1] + "' are both marked top: name one with -top"};
    }

    std::string ModuleList() const {
        std::string list;
        for (const auto& item : m_modules->items()) list += (list.empty() ? "" : ", ") + item.key();
        return list.empty() ? "it holds none" : "it holds " + list;
    }

    int NewNode() {
        const int node = static_cast<int>(m_parent.size());
        m_parent.push_back(node);
        m_names.emplace_back();
        return node;
    }
    int Root(int node) {
        while (m_parent[node] != node) node = m_parent[node] = m_parent[m_parent[node]];
        return node;
    }
    // Joins two bits; a constant stays the root of its class. Two different constants joined
    // would short them: refused.
    void Join(int a, int b, const std::string& path) {
        a = Root(a), b = Root(b);
        if (a == b) return;
        if (a < kConstants && b < kConstants)
            throw Refused{path + " joins the constants " + kConstantWords[a] + " and " + kConstantWords[b]};
        if (b < a) std::swap(a, b);
        m_parent[b] = a;
    }

    // The node of one bit of a module: a constant, or the module's bit number, known from its
    // ports or netnames when `known` holds it.
    int NodeOf(const json& bit, std::map<long long, int>& bits, const std::set<long long>* known,
               const std::string& path, const std::string& module) {
        if (bit.is_string()) {
            const std::string word = bit.get<std::string>();
            if (word == "0") return 0;
            if (word == "1") return 1;
            if (word == "x" || word == "z") return 2;
        } else if (bit.is_number_integer() && bit.get<long long>() >= 0) {
            const long long number = bit.get<long long>();
            if (known && !known->count(number))
                throw Refused{path + " is the bit " + std::to_string(number) + ", which no port or netname of module '" +
                              module + "' holds"};
            auto [it, fresh] = bits.emplace(number, 0);
            if (fresh) it->second = NewNode();
            return it->second;
        }
        throw Refused{path + " must be a bit number or \"0\", \"1\", \"x\" or \"z\", not " + Shown(bit)};
    }

    // Offers a name for a node; `rank` orders the offers (lower wins, the first of equals stays).
    void OfferName(int node, const std::string& name, int rank) {
        NameChoice& choice = m_names[node];
        if (choice.rank < 0 || rank < choice.rank) choice = {name, rank};
    }

    // Adds module `name` under the hierarchical `prefix`: its port bits are already in `bits` for an
    // instance (joined to the parent's), fresh for the top, whose ports become the design's.
    void Instantiate(const std::string& name, const std::string& prefix, std::map<long long, int>& bits, bool top,
                     std::vector<std::string>& stack) {
        if (std::find(stack.begin(), stack.end(), name) != stack.end()) {
            std::string chain;
            for (const std::string& m : stack) chain += m + " -> ";
            throw Refused{"module '" + name + "' instantiates itself: " + chain + name};
        }
        if (stack.size() >= kMaxDepth)
            throw Refused{"module '" + name + "' lies deeper than " + std::to_string(kMaxDepth) + " levels of instances"};
        // An instance costs work even with no cell in it: a hierarchy that multiplies them is refused.
        if (++m_instances > static_cast<std::size_t>(kMaxCount))
            throw Refused{"the netlist has more than " + std::to_string(kMaxCount) + " module instances"};
        stack.push_back(name);
        const std::string path = "netlist.modules." + name;
        const json& module = m_modules->at(name);
        if (!module.is_object()) throw Refused{path + " must be an object, not " + Shown(module)};
        const int depth = static_cast<int>(stack.size()) - 1;

        // The bits the module names: a cell may connect no other.
        std::set<long long> known;
        const auto learn = [&](const json& list) {
            for (const json& bit : list)
                if (bit.is_number_integer()) known.insert(bit.get<long long>());
        };
        const json& ports = Object(module, "ports", path, false);
        const json& netnames = Object(module, "netnames", path, false);
        for (const auto& [portName, port] : ports.items()) {
            if (!port.is_object()) throw Refused{path + ".ports." + portName + " must be an object, not " + Shown(port)};
            learn(List(port, "bits", path + ".ports." + portName));
        }
        for (const auto& [netName, net] : netnames.items()) {
            if (!net.is_object()) throw Refused{path + ".netnames." + netName + " must be an object, not " + Shown(net)};
            learn(List(net, "bits", path + ".netnames." + netName));
        }

        for (const auto& [portName, port] : ports.items()) {
            const std::string portPath = path + ".ports." + portName;
            const std::string direction = Text(port, "direction", portPath);
            if (direction != "input" && direction != "output" && direction != "inout")
                throw Refused{portPath + ".direction must be input, output or inout, not " + Shown(direction)};
            const json& list = List(port, "bits", portPath);
            for (std::size_t i = 0; i < list.size(); ++i) {
                const int node = NodeOf(list[i], bits, nullptr, portPath + ".bits[" + std::to_string(i) + "]", name);
                if (!top) continue;
                const std::string bitName = BitName(portName, port, i, list.size());
                m_ports.push_back({bitName, direction == "output", node});
                OfferName(node, bitName, depth);
            }
        }
        for (const auto& [netName, net] : netnames.items()) {
            const json& list = List(net, "bits", path + ".netnames." + netName);
            const bool hidden = netName.starts_with('$') || IsSet(net, "hide_name");
            for (std::size_t i = 0; i < list.size(); ++i) {
                const int node =
                    NodeOf(list[i], bits, nullptr, path + ".netnames." + netName + ".bits[" + std::to_string(i) + "]", name);
                OfferName(node, prefix + BitName(netName, net, i, list.size()), (hidden ? 1 << 20 : 0) + depth);
            }
        }

        for (const auto& [cellName, cell] : Object(module, "cells", path, false).items()) {
            const std::string cellPath = path + ".cells." + cellName;
            if (!cell.is_object()) throw Refused{cellPath + " must be an object, not " + Shown(cell)};
            const std::string type = Text(cell, "type", cellPath);
            const json& connections = Object(cell, "connections", cellPath, false);
            const bool instance = m_modules->contains(type) && m_modules->at(type).is_object() &&
                                  !IsSet(Object(m_modules->at(type), "attributes", "netlist.modules." + type, false),
                                         "blackbox");
            if (instance) {
                const json& inner = Object(m_modules->at(type), "ports", "netlist.modules." + type, false);
                std::map<long long, int> innerBits;
                for (const auto& [pin, list] : connections.items()) {
                    const std::string pinPath = cellPath + ".connections." + pin;
                    if (!inner.contains(pin))
                        throw Refused{pinPath + " connects the pin '" + pin + "', which module '" + type + "' has no port for"};
                    if (!list.is_array()) throw Refused{pinPath + " must be a list of bits, not " + Shown(list)};
                    const json& innerList = List(inner.at(pin), "bits", "netlist.modules." + type + ".ports." + pin);
                    if (innerList.size() != list.size())
                        throw Refused{pinPath + " has " + std::to_string(list.size()) + " bits, the port of module '" +
                                      type + "' " + std::to_string(innerList.size())};
                    for (std::size_t i = 0; i < list.size(); ++i) {
                        const std::string bitPath = pinPath + "[" + std::to_string(i) + "]";
                        const int outer = NodeOf(list[i], bits, &known, bitPath, name);
                        const int node = NodeOf(innerList[i], innerBits, nullptr, bitPath, type);
                        Join(outer, node, bitPath);
                    }
                }
                Instantiate(type, prefix + cellName + ".", innerBits, false, stack);
                continue;
            }
            RawCell raw{prefix + cellName, type, KnownType(type), {}, {}};
            raw.properties["kind"] = CellKindWord(raw.info.kind);
            for (const auto& [parameter, value] : Object(cell, "parameters", cellPath, false).items())
                raw.properties["param." + parameter] = value.is_string() ? value.get<std::string>() : value.dump();
            const json& directions = Object(cell, "port_directions", cellPath, false);
            for (const auto& [pin, list] : connections.items()) {
                const std::string pinPath = cellPath + ".connections." + pin;
                if (!list.is_array()) throw Refused{pinPath + " must be a list of bits, not " + Shown(list)};
                bool output = false;
                if (raw.info.known) {
                    output = std::find(raw.info.outputs.begin(), raw.info.outputs.end(), pin) != raw.info.outputs.end();
                } else {
                    const auto it = directions.find(pin);
                    if (it == directions.end() || !it->is_string())
                        throw Refused{pinPath + " connects the pin '" + pin + "' of type " + type +
                                      ", whose direction port_directions does not give"};
                    const std::string direction = it->get<std::string>();
                    if (direction != "input" && direction != "output" && direction != "inout")
                        throw Refused{cellPath + ".port_directions." + pin + " must be input, output or inout, not " +
                                      Shown(*it)};
                    output = direction == "output";
                }
                for (std::size_t i = 0; i < list.size(); ++i) {
                    const std::string bitPath = pinPath + "[" + std::to_string(i) + "]";
                    raw.pins.push_back({list.size() == 1 ? pin : pin + "[" + std::to_string(i) + "]",
                                        NodeOf(list[i], bits, &known, bitPath, name), output});
                }
            }
            if (m_cells.size() >= static_cast<std::size_t>(kMaxCount))
                throw Refused{"the flattened netlist holds more than " + std::to_string(kMaxCount) + " cells"};
            m_cells.push_back(std::move(raw));
        }
        stack.pop_back();
    }

    // Names are unique across cells, nets, ports and clocks, and no name is a site's (X<n>Y<n>).
    std::string Unique(const std::string& base, const char* kind) {
        const auto isSite = [](const std::string& n) {
            std::size_t y = n.find('Y');
            const auto digits = [&](std::size_t from, std::size_t to) {
                return to > from && std::all_of(n.begin() + static_cast<long>(from), n.begin() + static_cast<long>(to),
                                                [](char c) { return c >= '0' && c <= '9'; });
            };
            return n.size() > 3 && n[0] == 'X' && y != std::string::npos && digits(1, y) && digits(y + 1, n.size());
        };
        std::string name = base.empty() ? std::string(kind) : base;
        if (m_taken.count(name) || isSite(name)) {
            const std::string stem = name + "_" + kind;
            name = stem;
            for (int n = 2; m_taken.count(name); ++n) name = stem + std::to_string(n);
        }
        m_taken.insert(name);
        return name;
    }

    void Build() {
        Design& d = *m_design;
        for (const RawPort& p : m_ports) {
            IoPort port;
            port.name = Unique(p.name, "port");
            port.output = p.output;
            d.ports.push_back(std::move(port));
        }
        for (RawCell& raw : m_cells) {
            Cell cell;
            cell.name = Unique(raw.name, "cell");
            cell.type = raw.type;
            const CellDelays& delays = m_options.library.Of(raw.type, raw.info.kind);
            cell.delay = delays.delay;
            cell.setup = delays.setup;
            cell.sequential = !raw.info.clockPin.empty();
            cell.properties = std::move(raw.properties);
            d.cells.push_back(std::move(cell));
        }

        // One net per class of joined bits that something drives.
        std::map<int, std::size_t> netOf;  // root node -> index into d.nets
        const auto netFor = [&](int root) -> Net& {
            auto [it, fresh] = netOf.emplace(root, d.nets.size());
            if (fresh) d.nets.emplace_back();
            return d.nets[it->second];
        };
        const auto drive = [&](int node, const std::string& driver, const std::string& where) {
            const int root = Root(node);
            if (root < kConstants)
                throw Refused{where + " drives the constant " + std::string(kConstantWords[root])};
            Net& net = netFor(root);
            if (!net.driver.empty())
                throw Refused{where + " drives a net that '" + net.driver + "' drives already"};
            net.driver = driver;
        };
        for (std::size_t i = 0; i < m_ports.size(); ++i)
            if (!m_ports[i].output) drive(m_ports[i].node, d.ports[i].name, "the input port '" + d.ports[i].name + "'");
        for (std::size_t i = 0; i < m_cells.size(); ++i)
            for (const PinBit& pin : m_cells[i].pins)
                if (pin.output && Root(pin.node) >= kConstants)
                    drive(pin.node, d.cells[i].name, "pin " + pin.pin + " of cell '" + d.cells[i].name + "'");
        // Loads of nets without a driver are left unconnected.
        const auto load = [&](int node, const std::string& who) {
            const auto it = netOf.find(Root(node));
            if (it == netOf.end()) return;
            std::vector<std::string>& loads = d.nets[it->second].loads;
            if (loads.empty() || loads.back() != who) loads.push_back(who);
        };
        for (std::size_t i = 0; i < m_ports.size(); ++i)
            if (m_ports[i].output) load(m_ports[i].node, d.ports[i].name);
        for (std::size_t i = 0; i < m_cells.size(); ++i)
            for (const PinBit& pin : m_cells[i].pins)
                if (!pin.output) load(pin.node, d.cells[i].name);
        for (Net& net : d.nets) {
            std::sort(net.loads.begin(), net.loads.end());
            net.loads.erase(std::unique(net.loads.begin(), net.loads.end()), net.loads.end());
        }
        for (const auto& [root, index] : netOf) {
            const std::string& name = m_names[root].name;
            d.nets[index].name = Unique(name.empty() ? "$net" + std::to_string(root) : name, "net");
        }

        // What each pin connects, for a script to follow: a net, a constant, or nothing.
        for (std::size_t i = 0; i < m_cells.size(); ++i)
            for (const PinBit& pin : m_cells[i].pins) {
                const int root = Root(pin.node);
                const auto it = netOf.find(root);
                d.cells[i].properties["pin." + pin.pin] = root < kConstants ? kConstantWords[root]
                                                          : it != netOf.end() ? d.nets[it->second].name
                                                                              : "";
            }

        // Clocks: the nets named by the options, then the nets on the clock pins of sequential cells.
        std::map<std::size_t, std::string> clockOfNet;  // net index -> clock name
        const auto addClock = [&](std::size_t net, double period) {
            if (clockOfNet.count(net)) return;
            Clock clock;
            clock.name = Unique(d.nets[net].name + "_clock", "clock");
            clock.period = period;
            clock.net = d.nets[net].name;
            clockOfNet[net] = clock.name;
            d.clocks.push_back(std::move(clock));
        };
        for (const auto& [word, period] : m_options.clocks) {
            std::optional<std::size_t> found;
            for (std::size_t n = 0; n < d.nets.size() && !found; ++n)
                if (d.nets[n].name == word || d.nets[n].driver == word) found = n;
            if (!found) throw Refused{"-clock names '" + word + "', which is no net or input port of the design"};
            addClock(*found, period);
        }
        for (std::size_t i = 0; i < m_cells.size(); ++i) {
            if (m_cells[i].info.clockPin.empty()) continue;
            for (const PinBit& pin : m_cells[i].pins) {
                if (pin.pin != m_cells[i].info.clockPin) continue;
                const auto it = netOf.find(Root(pin.node));
                if (it == netOf.end()) continue;
                addClock(it->second, kDefaultClockPeriod);
                d.cells[i].clock = clockOfNet[it->second];
            }
        }
    }

    const NetlistOptions& m_options;
    const json* m_modules = nullptr;
    std::vector<int> m_parent;        // the joined bits, a forest over nodes
    std::vector<NameChoice> m_names;  // by node
    std::vector<RawPort> m_ports;
    std::vector<RawCell> m_cells;
    std::set<std::string> m_taken;
    std::size_t m_instances = 0;
    std::unique_ptr<Design> m_design;
};

}  // namespace

CellKind KindOfType(const std::string& type) { return KnownType(type).kind; }

std::unique_ptr<Design> ImportNetlist(const std::string& file, const std::string& text, const NetlistOptions& options,
                                      std::string& error) {
    const std::string where = "cannot import the netlist '" + file + "': ";
    json root;
    try {
        root = json::parse(text);
    } catch (const nlohmann::json::exception& e) {
        error = where + "it is not valid JSON (" + e.what() + ")";
        return nullptr;
    }
    try {
        auto design = Importer(root, options).Run();
        design->properties["netlist"] = file;
        design->properties["seed"] = std::to_string(options.seed);
        design->properties["delay_library"] = options.library.file;
        if (std::string problem = PlaceSimple(*design, options); !problem.empty()) {
            error = where + problem;
            return nullptr;
        }
        if (std::string problem = design->Index(); !problem.empty()) {
            error = where + problem;
            return nullptr;
        }
        return design;
    } catch (const Refused& refused) {
        error = where + refused.text;
    } catch (const std::exception& e) {
        error = where + e.what();
    }
    return nullptr;
}

}  // namespace kelmartool
