// The floorplan constraint files, in four text forms that hold the same things: blocks with their
// cells and constraints, prohibited sites and port locations. Blank lines are allowed everywhere.
//
// ucf: one statement a line, '#' starts a comment line; keys in upper case, values quoted.
//     BLOCK "b1" CELLS = "u1 u2";
//     BLOCK "b1" REGION = "X0Y0:X3Y3";
//     BLOCK "b1" CAPACITY = "4";          (any other constraint the same way)
//     PROHIBIT SITE = "X1Y2";
//     PORT "p1" LOC = "X0Y1";
//
// csv: the header line "kind,name,key,value", then one row each; a field with a comma or a quote is
// quoted, a quote inside doubled.
//     block,b1,cells,u1 u2
//     block,b1,region,X0Y0:X3Y3
//     prohibit,X1Y2,,
//     port,p1,loc,X0Y1
//
// vhdl: attribute statements ("attribute X of Y : CLASS is VALUE;"), "--" starts a comment,
// attribute declarations are skipped. A block
// is a label, a prohibited site a literal, a port a signal.
//     attribute kel_cells of b1 : label is "u1 u2";
//     attribute kel_region of b1 : label is "X0Y0:X3Y3";
//     attribute kel_prohibit of X1Y2 : literal is "true";
//     attribute kel_loc of p1 : signal is "X0Y1";
//
// vlog: attribute instances in front of a kind and a name, "//" starts a comment.
//     (* kel_cells = "u1 u2", kel_region = "X0Y0:X3Y3" *) block b1;
//     (* kel_prohibit *) site X1Y2;
//     (* kel_loc = "X0Y1" *) port p1;
//
// In the quoted values of ucf, vhdl and vlog a backslash escapes a quote or a backslash.
#include <algorithm>
#include <cctype>
#include <charconv>
#include <sstream>

#include "floorplan_model.h"

namespace kelmartool {

// ---------------------------------------------------------------------------------------------
// Regions

namespace {

bool Number(std::string_view digits, int& out) {
    if (digits.empty()) return false;
    const auto [end, ec] = std::from_chars(digits.data(), digits.data() + digits.size(), out);
    return ec == std::errc() && end == digits.data() + digits.size();
}

}  // namespace

bool ParseSiteName(std::string_view name, int& x, int& y) {
    const auto ypos = name.find('Y');
    return name.size() >= 4 && name[0] == 'X' && ypos != std::string_view::npos &&
           Number(name.substr(1, ypos - 1), x) && Number(name.substr(ypos + 1), y) && x >= 0 && y >= 0;
}

bool ParseRegion(const std::string& text, Region& region, std::string& error) {
    int v[4] = {0, 0, 0, 0};
    bool ok = false;
    const std::string_view whole = text;
    if (const auto colon = whole.find(':'); colon != std::string_view::npos) {
        ok = ParseSiteName(whole.substr(0, colon), v[0], v[1]) && ParseSiteName(whole.substr(colon + 1), v[2], v[3]);
    } else {
        std::istringstream in(text);
        std::string word;
        int count = 0;
        ok = true;
        while (in >> word) {
            if (count == 4 || !Number(word, v[count])) ok = false;
            ++count;
        }
        ok = ok && count == 4;
    }
    if (!ok) {
        error = "a region is X0Y0:X3Y3 or four numbers x0 y0 x1 y1, not '" + text + "'";
        return false;
    }
    region = Region{std::min(v[0], v[2]), std::min(v[1], v[3]), std::max(v[0], v[2]), std::max(v[1], v[3])};
    return true;
}

std::string RegionText(const Region& r) {
    // Corners off the device's lower edge cannot be named as sites; those regions read as numbers.
    if (r.x0 < 0 || r.y0 < 0)
        return std::to_string(r.x0) + " " + std::to_string(r.y0) + " " + std::to_string(r.x1) + " " +
               std::to_string(r.y1);
    return Device::SiteName(r.x0, r.y0) + ":" + Device::SiteName(r.x1, r.y1);
}

std::optional<Region> RegionOf(const Block& b) {
    if (!b.x0 || !b.y0 || !b.x1 || !b.y1) return std::nullopt;
    return Region{*b.x0, *b.y0, *b.x1, *b.y1};
}

void SetRegion(Block& b, const std::optional<Region>& r) {
    if (r) {
        b.x0 = r->x0, b.y0 = r->y0, b.x1 = r->x1, b.y1 = r->y1;
    } else {
        b.x0.reset(), b.y0.reset(), b.x1.reset(), b.y1.reset();
    }
}

void MergeConstraints(FloorplanConstraints& base, const FloorplanConstraints& extra) {
    for (const Block& b : extra.blocks) {
        auto it =
            std::find_if(base.blocks.begin(), base.blocks.end(), [&b](const Block& o) { return o.name == b.name; });
        if (it == base.blocks.end()) {
            base.blocks.push_back(b);
            continue;
        }
        for (const std::string& cell : b.cells)
            if (std::find(it->cells.begin(), it->cells.end(), cell) == it->cells.end()) it->cells.push_back(cell);
        if (auto r = RegionOf(b)) SetRegion(*it, r);
        for (const auto& [key, value] : b.constraints) it->constraints[key] = value;
    }
    base.prohibited.insert(extra.prohibited.begin(), extra.prohibited.end());
    for (const auto& [port, site] : extra.ports) base.ports[port] = site;
}

const char* FormWord(ConstraintForm form) noexcept {
    switch (form) {
        case ConstraintForm::Ucf:
            return "ucf";
        case ConstraintForm::Csv:
            return "csv";
        case ConstraintForm::Vhdl:
            return "vhdl";
        case ConstraintForm::Vlog:
            return "vlog";
    }
    return "";
}

namespace {

// ---------------------------------------------------------------------------------------------
// What every form has in common: one entry per block key, prohibited site and port.

struct Entry {
    enum What { BlockKey, Prohibit, Port } what;
    std::string name;  // block, site or port
    std::string key;   // block key: cells, region or a constraint
    std::string value;
};

std::vector<Entry> Entries(const FloorplanConstraints& c) {
    std::vector<Entry> out;
    for (const Block& b : c.blocks) {
        std::string cells;
        for (const std::string& cell : b.cells) cells += (cells.empty() ? "" : " ") + cell;
        out.push_back({Entry::BlockKey, b.name, "cells", cells});
        if (auto r = RegionOf(b)) out.push_back({Entry::BlockKey, b.name, "region", RegionText(*r)});
        for (const auto& [key, value] : b.constraints) out.push_back({Entry::BlockKey, b.name, key, value});
    }
    for (const std::string& site : c.prohibited) out.push_back({Entry::Prohibit, site, "", ""});
    for (const auto& [port, site] : c.ports) out.push_back({Entry::Port, port, "loc", site});
    return out;
}

// Adds one entry; the first entry of a block makes it.
bool Apply(FloorplanConstraints& c, const Entry& e, std::string& error) {
    switch (e.what) {
        case Entry::Prohibit:
            c.prohibited.insert(e.name);
            return true;
        case Entry::Port:
            c.ports[e.name] = e.value;
            return true;
        case Entry::BlockKey:
            break;
    }
    if (e.name.empty()) {
        error = "a block needs a name";
        return false;
    }
    auto it = std::find_if(c.blocks.begin(), c.blocks.end(), [&e](const Block& b) { return b.name == e.name; });
    if (it == c.blocks.end()) {
        c.blocks.push_back(Block{});
        it = std::prev(c.blocks.end());
        it->name = e.name;
    }
    if (e.key == "cells") {
        std::istringstream in(e.value);
        for (std::string cell; in >> cell;) it->cells.push_back(cell);
    } else if (e.key == "region") {
        Region r;
        if (!ParseRegion(e.value, r, error)) return false;
        SetRegion(*it, r);
    } else if (e.key.empty()) {
        error = "a block constraint needs a name";
        return false;
    } else {
        it->constraints[e.key] = e.value;
    }
    return true;
}

std::string Lower(std::string text) {
    for (char& c : text) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return text;
}

std::string Upper(std::string text) {
    for (char& c : text) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    return text;
}

std::string Quoted(const std::string& text) {
    std::string out = "\"";
    for (char c : text) {
        if (c == '"' || c == '\\') out += '\\';
        out += c;
    }
    return out + "\"";
}

// Reads one line of a form word by word.
class Scanner {
public:
    explicit Scanner(std::string_view line) : m_line(line) {}

    bool AtEnd() {
        Skip();
        return m_pos >= m_line.size();
    }
    // A word of letters, digits and _ (and whatever else is not blank or punctuation of the forms).
    bool Word(std::string& out) {
        Skip();
        const std::size_t start = m_pos;
        while (m_pos < m_line.size() && !std::isspace(static_cast<unsigned char>(m_line[m_pos])) &&
               std::string_view("\";=,:*()").find(m_line[m_pos]) == std::string_view::npos)
            ++m_pos;
        out.assign(m_line.substr(start, m_pos - start));
        return !out.empty();
    }
    bool Keyword(std::string_view word) {
        const std::size_t keep = m_pos;
        std::string w;
        if (Word(w) && w == word) return true;
        m_pos = keep;
        return false;
    }
    bool Punct(std::string_view text) {
        Skip();
        if (m_line.substr(m_pos, text.size()) != text) return false;
        m_pos += text.size();
        return true;
    }
    bool String(std::string& out) {
        if (!Punct("\"")) return false;
        out.clear();
        while (m_pos < m_line.size() && m_line[m_pos] != '"') {
            if (m_line[m_pos] == '\\' && m_pos + 1 < m_line.size()) ++m_pos;
            out += m_line[m_pos++];
        }
        return Punct("\"");
    }

private:
    void Skip() {
        while (m_pos < m_line.size() && std::isspace(static_cast<unsigned char>(m_line[m_pos]))) ++m_pos;
    }
    std::string_view m_line;
    std::size_t m_pos = 0;
};

// ---------------------------------------------------------------------------------------------
// ucf

std::string FormatUcf(const std::vector<Entry>& entries, const std::string& design) {
    std::string out = "# Floorplan constraints of design " + design + "\n";
    for (const Entry& e : entries) {
        if (e.what == Entry::BlockKey)
            out += "BLOCK " + Quoted(e.name) + " " + Upper(e.key) + " = " + Quoted(e.value) + ";\n";
        else if (e.what == Entry::Prohibit)
            out += "PROHIBIT SITE = " + Quoted(e.name) + ";\n";
        else
            out += "PORT " + Quoted(e.name) + " LOC = " + Quoted(e.value) + ";\n";
    }
    return out;
}

bool ParseUcfLine(std::string_view line, Entry& e) {
    Scanner s(line);
    std::string key;
    if (s.Keyword("BLOCK")) {
        e.what = Entry::BlockKey;
        if (!s.String(e.name) || !s.Word(key)) return false;
        e.key = Lower(key);
    } else if (s.Keyword("PROHIBIT")) {
        e.what = Entry::Prohibit;
        if (!s.Keyword("SITE") || !s.Punct("=") || !s.String(e.name)) return false;
        return s.Punct(";") && s.AtEnd();
    } else if (s.Keyword("PORT")) {
        e.what = Entry::Port;
        if (!s.String(e.name) || !s.Keyword("LOC")) return false;
        e.key = "loc";
    } else {
        return false;
    }
    return s.Punct("=") && s.String(e.value) && s.Punct(";") && s.AtEnd();
}

// ---------------------------------------------------------------------------------------------
// csv

std::string CsvField(const std::string& text) {
    if (text.find_first_of(",\"\n") == std::string::npos) return text;
    std::string out = "\"";
    for (char c : text) out += c == '"' ? std::string("\"\"") : std::string(1, c);
    return out + "\"";
}

std::string FormatCsv(const std::vector<Entry>& entries) {
    std::string out = "kind,name,key,value\n";
    for (const Entry& e : entries) {
        const char* kind = e.what == Entry::BlockKey ? "block" : e.what == Entry::Prohibit ? "prohibit" : "port";
        out += std::string(kind) + "," + CsvField(e.name) + "," + CsvField(e.key) + "," + CsvField(e.value) + "\n";
    }
    return out;
}

bool CsvFields(std::string_view line, std::vector<std::string>& fields) {
    fields.assign(1, "");
    std::size_t i = 0;
    while (i < line.size()) {
        const char c = line[i];
        if (c == ',') {
            fields.emplace_back();
            ++i;
        } else if (c == '"' && fields.back().empty()) {
            ++i;
            for (;;) {
                if (i >= line.size()) return false;
                if (line[i] == '"') {
                    if (i + 1 < line.size() && line[i + 1] == '"') {
                        fields.back() += '"';
                        i += 2;
                        continue;
                    }
                    ++i;
                    break;
                }
                fields.back() += line[i++];
            }
            if (i < line.size() && line[i] != ',') return false;
        } else {
            fields.back() += c;
            ++i;
        }
    }
    return true;
}

bool ParseCsvLine(std::string_view line, Entry& e) {
    std::vector<std::string> f;
    if (!CsvFields(line, f) || f.size() != 4) return false;
    if (f[0] == "block")
        e.what = Entry::BlockKey;
    else if (f[0] == "prohibit")
        e.what = Entry::Prohibit;
    else if (f[0] == "port" && f[2] == "loc")
        e.what = Entry::Port;
    else
        return false;
    e.name = f[1];
    e.key = f[2];
    e.value = f[3];
    return !e.name.empty();
}

// ---------------------------------------------------------------------------------------------
// vhdl

std::string FormatVhdl(const std::vector<Entry>& entries, const std::string& design) {
    std::set<std::string> keys;
    for (const Entry& e : entries) keys.insert(e.what == Entry::Prohibit ? "prohibit" : e.key);
    std::string out = "-- Floorplan constraints of design " + design + "\n";
    for (const std::string& key : keys) out += "attribute kel_" + key + " : string;\n";
    for (const Entry& e : entries) {
        if (e.what == Entry::BlockKey)
            out += "attribute kel_" + e.key + " of " + e.name + " : label is " + Quoted(e.value) + ";\n";
        else if (e.what == Entry::Prohibit)
            out += "attribute kel_prohibit of " + e.name + " : literal is \"true\";\n";
        else
            out += "attribute kel_loc of " + e.name + " : signal is " + Quoted(e.value) + ";\n";
    }
    return out;
}

// False on a line that is no attribute statement; `skip` is set for an attribute declaration.
bool ParseVhdlLine(std::string_view line, Entry& e, bool& skip) {
    Scanner s(line);
    std::string attribute, name, entityClass;
    if (!s.Keyword("attribute") || !s.Word(attribute) || attribute.rfind("kel_", 0) != 0) return false;
    if (s.Punct(":")) {
        skip = true;
        return s.Keyword("string") && s.Punct(";") && s.AtEnd();
    }
    const std::string key = attribute.substr(4);
    if (!s.Keyword("of") || !s.Word(name) || !s.Punct(":") || !s.Word(entityClass) || !s.Keyword("is") ||
        !s.String(e.value) || !s.Punct(";") || !s.AtEnd())
        return false;
    e.name = name;
    e.key = key;
    if (entityClass == "label" && key != "prohibit" && key != "loc")
        e.what = Entry::BlockKey;
    else if (entityClass == "literal" && key == "prohibit")
        e.what = Entry::Prohibit;
    else if (entityClass == "signal" && key == "loc")
        e.what = Entry::Port;
    else
        return false;
    return true;
}

// ---------------------------------------------------------------------------------------------
// vlog

std::string FormatVlog(const FloorplanConstraints& c, const std::string& design) {
    std::string out = "// Floorplan constraints of design " + design + "\n";
    // A block is one statement with all its keys.
    for (const Block& b : c.blocks) {
        FloorplanConstraints one;
        one.blocks.push_back(b);
        std::string attributes;
        for (const Entry& e : Entries(one))
            attributes += (attributes.empty() ? "" : ", ") + ("kel_" + e.key) + " = " + Quoted(e.value);
        out += "(* " + attributes + " *) block " + b.name + ";\n";
    }
    for (const std::string& site : c.prohibited) out += "(* kel_prohibit *) site " + site + ";\n";
    for (const auto& [port, site] : c.ports) out += "(* kel_loc = " + Quoted(site) + " *) port " + port + ";\n";
    return out;
}

bool ParseVlogLine(std::string_view line, std::vector<Entry>& entries) {
    Scanner s(line);
    if (!s.Punct("(*")) return false;
    std::vector<std::pair<std::string, std::string>> attributes;
    do {
        std::string key, value;
        if (!s.Word(key) || key.rfind("kel_", 0) != 0) return false;
        bool valued = s.Punct("=");
        if (valued && !s.String(value)) return false;
        attributes.emplace_back(key.substr(4), valued ? value : std::string("true"));
    } while (s.Punct(","));
    std::string kind, name;
    if (!s.Punct("*)") || !s.Word(kind) || !s.Word(name) || !s.Punct(";") || !s.AtEnd()) return false;
    for (const auto& [key, value] : attributes) {
        Entry e{Entry::BlockKey, name, key, value};
        if (kind == "site" && key == "prohibit")
            e.what = Entry::Prohibit;
        else if (kind == "port" && key == "loc")
            e.what = Entry::Port;
        else if (kind != "block" || key == "prohibit" || key == "loc")
            return false;
        entries.push_back(std::move(e));
    }
    return true;
}

std::string_view StripComment(std::string_view line, std::string_view marker) {
    // A marker inside a quoted value is part of the value.
    bool quoted = false;
    for (std::size_t i = 0; i < line.size(); ++i) {
        if (line[i] == '\\' && quoted)
            ++i;
        else if (line[i] == '"')
            quoted = !quoted;
        else if (!quoted && line.substr(i, marker.size()) == marker)
            return line.substr(0, i);
    }
    return line;
}

// The design's name as the first comment line shows it: on one line, whatever it holds.
std::string OneLine(std::string text) {
    std::replace_if(text.begin(), text.end(), [](char c) { return c == '\n' || c == '\r'; }, ' ');
    return text;
}

std::string Format(ConstraintForm form, const FloorplanConstraints& c, const std::string& design) {
    switch (form) {
        case ConstraintForm::Ucf:
            return FormatUcf(Entries(c), OneLine(design));
        case ConstraintForm::Csv:
            return FormatCsv(Entries(c));
        case ConstraintForm::Vhdl:
            return FormatVhdl(Entries(c), OneLine(design));
        case ConstraintForm::Vlog:
            return FormatVlog(c, OneLine(design));
    }
    return {};
}

bool HoldsExactly(ConstraintForm form, const FloorplanConstraints& c) {
    FloorplanConstraints back;
    std::string ignored;
    return ParseConstraints(form, Format(form, c, ""), back, ignored) && back == c;
}

// The first item of `c` that the form cannot hold, tried one at a time.
std::string FirstUnheld(ConstraintForm form, const FloorplanConstraints& c) {
    const auto quote = [](const std::string& name) { return "'" + name + "'"; };
    for (const Block& b : c.blocks) {
        const auto holds = [form](const Block& block) {
            FloorplanConstraints one;
            one.blocks.push_back(block);
            return HoldsExactly(form, one);
        };
        Block part;
        part.name = b.name;
        if (!holds(part)) return "the name of block " + quote(b.name);
        part.cells = b.cells;
        if (!holds(part)) return "the cells of block " + quote(b.name);
        part.cells.clear();
        SetRegion(part, RegionOf(b));
        if (!holds(part)) return "the region of block " + quote(b.name);
        SetRegion(part, std::nullopt);
        for (const auto& [key, value] : b.constraints) {
            part.constraints = {{key, value}};
            if (!holds(part)) return "the " + key + " of block " + quote(b.name);
        }
    }
    for (const std::string& site : c.prohibited) {
        FloorplanConstraints one;
        one.prohibited.insert(site);
        if (!HoldsExactly(form, one)) return "the prohibited site " + quote(site);
    }
    for (const auto& [port, site] : c.ports) {
        FloorplanConstraints one;
        one.ports[port] = site;
        if (!HoldsExactly(form, one)) return "port " + quote(port) + " on " + quote(site);
    }
    return "these constraints";
}

}  // namespace

bool FormatConstraints(ConstraintForm form, const FloorplanConstraints& c, const std::string& design,
                       std::string& text, std::string& error) {
    std::string formatted = Format(form, c, design);
    FloorplanConstraints back;
    std::string ignored;
    if (!ParseConstraints(form, formatted, back, ignored) || !(back == c)) {
        error = std::string("the ") + FormWord(form) + " form cannot hold " + FirstUnheld(form, c);
        return false;
    }
    text = std::move(formatted);
    return true;
}

bool ParseConstraints(ConstraintForm form, const std::string& text, FloorplanConstraints& out, std::string& error) {
    FloorplanConstraints parsed;
    std::istringstream in(text);
    std::string raw;
    int number = 0;
    bool header = form != ConstraintForm::Csv;
    while (std::getline(in, raw)) {
        ++number;
        if (!raw.empty() && raw.back() == '\r') raw.pop_back();
        std::string_view line = raw;
        if (form == ConstraintForm::Ucf && line.find_first_not_of(" \t") != std::string_view::npos &&
            line[line.find_first_not_of(" \t")] == '#')
            continue;
        if (form == ConstraintForm::Vhdl) line = StripComment(line, "--");
        if (form == ConstraintForm::Vlog) line = StripComment(line, "//");
        if (line.find_first_not_of(" \t") == std::string_view::npos) continue;
        const std::string where = std::string("line ") + std::to_string(number) + " of the " + FormWord(form) + " text";
        if (!header) {
            if (line != "kind,name,key,value") {
                error = where + ": the first line must be kind,name,key,value";
                return false;
            }
            header = true;
            continue;
        }
        std::vector<Entry> entries(1);
        bool ok = false, skip = false;
        switch (form) {
            case ConstraintForm::Ucf:
                ok = ParseUcfLine(line, entries[0]);
                break;
            case ConstraintForm::Csv:
                ok = ParseCsvLine(line, entries[0]);
                break;
            case ConstraintForm::Vhdl:
                ok = ParseVhdlLine(line, entries[0], skip);
                break;
            case ConstraintForm::Vlog:
                entries.clear();
                ok = ParseVlogLine(line, entries);
                break;
        }
        if (!ok) {
            error = where + " cannot be read: " + std::string(line);
            return false;
        }
        if (skip) continue;
        for (const Entry& e : entries) {
            std::string problem;
            if (!Apply(parsed, e, problem)) {
                error = where + ": " + problem;
                return false;
            }
        }
    }
    if (!header) {
        error = std::string("the ") + FormWord(form) + " text is empty: it needs the line kind,name,key,value";
        return false;
    }
    out = std::move(parsed);
    return true;
}

}  // namespace kelmartool
