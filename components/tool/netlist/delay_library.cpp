// Reading a delay library:
//
//   { "unit": "ns",
//     "default": { "LUT": { "delay": 0.45 }, ..., "FF": { "clock_to_q": 0.3, "setup": 0.1 }, ... },
//     "cells":   { "SB_LUT4": { "delay": 0.42 }, "SB_DFF": { "setup": 0.08 }, ... },
//     "net":     { "base": 0.1, "per_site": 0.05 } }
//
// "default" gives every kind all of its fields; an entry of "cells" gives some of them, the rest
// coming from its kind's default. A combinational kind has "delay", a sequential one "clock_to_q"
// and "setup". Nothing else is taken, so that a misspelt key cannot pass unnoticed.
#include "delay_library.h"

#include <cmath>

#include <nlohmann/json.hpp>

#include "Port/Folder.h"
#include "design.h"
#include "json_shown.h"

namespace kelmartool {

const char* CellKindWord(CellKind kind) noexcept {
    switch (kind) {
        case CellKind::Lut: return "LUT";
        case CellKind::Gate: return "GATE";
        case CellKind::Ff: return "FF";
        case CellKind::Carry: return "CARRY";
        case CellKind::Ram: return "RAM";
        case CellKind::Other: break;
    }
    return "OTHER";
}

bool IsSequential(CellKind kind) noexcept { return kind == CellKind::Ff || kind == CellKind::Ram; }

const CellDelays& DelayLibrary::Of(const std::string& type, CellKind kind) const {
    const auto it = cells.find(type);
    return it != cells.end() ? it->second : defaults[static_cast<std::size_t>(kind)];
}

namespace {

using json = nlohmann::ordered_json;

struct Refused {
    std::string text;
};

double Time(const json& value, const std::string& path) {
    if (!value.is_number() || !std::isfinite(value.get<double>()) || value.get<double>() < 0 ||
        value.get<double>() > kMaxTime)
        throw Refused{path + " must be a number of ns from 0 to 1e9, not " + Shown(value)};
    return value.get<double>();
}

const json& Member(const json& node, const char* key, const std::string& path) {
    const auto it = node.find(key);
    if (it == node.end()) throw Refused{path + "." + key + " is missing"};
    if (!it->is_object()) throw Refused{path + "." + key + " must be an object, not " + Shown(*it)};
    return *it;
}

// The fields of one entry over `base`; `complete`: every field of the kind must be given.
CellDelays Entry(const json& node, CellKind kind, CellDelays base, bool complete, const std::string& path) {
    if (!node.is_object()) throw Refused{path + " must be an object, not " + Shown(node)};
    const bool sequential = IsSequential(kind);
    const char* const wanted = sequential ? "clock_to_q and setup" : "delay";
    for (const auto& [key, value] : node.items()) {
        if (sequential && key == "clock_to_q") base.delay = Time(value, path + "." + key);
        else if (sequential && key == "setup") base.setup = Time(value, path + "." + key);
        else if (!sequential && key == "delay") base.delay = Time(value, path + "." + key);
        else
            throw Refused{path + " has the key '" + key + "': a cell of kind " + CellKindWord(kind) + " takes " + wanted};
    }
    if (complete && (sequential ? !node.contains("clock_to_q") || !node.contains("setup") : !node.contains("delay")))
        throw Refused{path + " must give " + wanted};
    return base;
}

DelayLibrary Read(const json& root) {
    if (!root.is_object()) throw Refused{"the top level must be an object, not " + Shown(root)};
    for (const auto& [key, value] : root.items()) {
        if (key == "unit") {
            if (value != "ns") throw Refused{"library.unit must be \"ns\", not " + Shown(value)};
        } else if (key != "default" && key != "cells" && key != "net") {
            throw Refused{"library has the key '" + key + "': it takes unit, default, cells and net"};
        }
    }
    DelayLibrary library;
    const json& defaults = Member(root, "default", "library");
    for (const auto& item : defaults.items()) {
        bool known = false;
        for (std::size_t k = 0; k < kCellKinds; ++k) known = known || item.key() == CellKindWord(static_cast<CellKind>(k));
        if (!known)
            throw Refused{"library.default has the kind '" + item.key() + "': the kinds are LUT, GATE, FF, CARRY, RAM, OTHER"};
    }
    for (std::size_t k = 0; k < kCellKinds; ++k) {
        const auto kind = static_cast<CellKind>(k);
        const std::string path = std::string("library.default.") + CellKindWord(kind);
        const auto it = defaults.find(CellKindWord(kind));
        if (it == defaults.end()) throw Refused{path + " is missing"};
        library.defaults[k] = Entry(*it, kind, {}, true, path);
    }
    if (const auto cells = root.find("cells"); cells != root.end()) {
        if (!cells->is_object()) throw Refused{"library.cells must be an object, not " + Shown(*cells)};
        for (const auto& [type, entry] : cells->items()) {
            const CellKind kind = KindOfType(type);
            library.cells[type] =
                Entry(entry, kind, library.defaults[static_cast<std::size_t>(kind)], false, "library.cells." + type);
        }
    }
    const json& net = Member(root, "net", "library");
    for (const auto& [key, value] : net.items())
        if (key != "base" && key != "per_site")
            throw Refused{"library.net has the key '" + key + "': it takes base and per_site"};
    for (const char* key : {"base", "per_site"})
        if (!net.contains(key)) throw Refused{std::string("library.net.") + key + " is missing"};
    library.netBase = Time(net.at("base"), "library.net.base");
    library.netPerSite = Time(net.at("per_site"), "library.net.per_site");
    return library;
}

// An address inside this library, for dladdr.
void Anchor() {}

}  // namespace

std::string ReadDelayLibrary(const std::string& file, const std::string& text, DelayLibrary& out) {
    const std::string where = "cannot read the delay library '" + file + "': ";
    json root;
    try {
        root = json::parse(text);
    } catch (const nlohmann::json::exception& e) {
        return where + "it is not valid JSON (" + e.what() + ")";
    }
    try {
        DelayLibrary library = Read(root);
        library.file = file;
        out = std::move(library);
        return {};
    } catch (const Refused& refused) {
        return where + refused.text;
    }
}

std::string DefaultDelayLibraryFile() {
    return Port::FolderOf(reinterpret_cast<const void*>(&Anchor)) + "kelmartool_delays.json";
}

}  // namespace kelmartool
