// The design model: name index, checks and lookups; typed settings; the tool state.
#include "design.h"

#include <algorithm>
#include <array>
#include <cctype>
#include <charconv>
#include <cmath>
#include <cstdio>

#include "property.h"

namespace kelmartool {

namespace {

constexpr std::array<const char*, 6> kKindWords{"cell", "net", "port", "clock", "bank", "site"};

std::string Num(double value) {
    TclValue v(NewDouble(value));
    return v.Text();
}

}  // namespace

const char* KindWord(Kind kind) noexcept { return kKindWords[static_cast<std::size_t>(kind)]; }

std::optional<Kind> KindFromWord(std::string_view word) noexcept {
    for (std::size_t i = 0; i < kKindWords.size(); ++i)
        if (word == kKindWords[i]) return static_cast<Kind>(i);
    return std::nullopt;
}

// ---------------------------------------------------------------------------------------------

std::string Device::SiteName(int x, int y) { return "X" + std::to_string(x) + "Y" + std::to_string(y); }

std::optional<SiteRef> Device::ParseSite(std::string_view name) const {
    if (name.size() < 4 || name[0] != 'X') return std::nullopt;
    const auto ypos = name.find('Y');
    if (ypos == std::string_view::npos || ypos < 2 || ypos + 1 >= name.size()) return std::nullopt;
    auto number = [](std::string_view digits, int& out) {
        if (digits.empty() || digits.size() > 6) return false;
        for (char c : digits)
            if (!std::isdigit(static_cast<unsigned char>(c))) return false;
        if (digits.size() > 1 && digits[0] == '0') return false;  // one spelling per site
        std::from_chars(digits.data(), digits.data() + digits.size(), out);
        return true;
    };
    SiteRef site;
    if (!number(name.substr(1, ypos - 1), site.x) || !number(name.substr(ypos + 1), site.y)) return std::nullopt;
    if (!OnDevice(site.x, site.y)) return std::nullopt;
    return site;
}

const Bank* Device::BankOf(int x, int y) const noexcept {
    for (const Bank& bank : banks)
        if (bank.Contains(x, y)) return &bank;
    return nullptr;
}

// ---------------------------------------------------------------------------------------------

std::string Design::Index() {
    m_index.clear();
    if (device.columns <= 0 || device.rows <= 0) return "the device needs at least one column and one row";
    if (device.siteCapacity <= 0) return "the site capacity of the device must be positive";
    auto add = [this](const std::string& objectName, Kind kind, std::size_t index) -> std::string {
        if (objectName.empty()) return std::string("a ") + KindWord(kind) + " has no name";
        if (device.ParseSite(objectName)) return "the name '" + objectName + "' is taken by a site";
        auto [it, fresh] = m_index.emplace(objectName, ObjectRef{kind, index});
        if (!fresh)
            return std::string("the name '") + objectName + "' is used twice (" + KindWord(it->second.kind) + " and " +
                   KindWord(kind) + ")";
        return {};
    };
    std::string problem;
    for (std::size_t i = 0; i < device.banks.size() && problem.empty(); ++i) {
        const Bank& b = device.banks[i];
        problem = add(b.name, Kind::Bank, i);
        if (problem.empty() && (!device.OnDevice(b.x0, b.y0) || !device.OnDevice(b.x1, b.y1) || b.x0 > b.x1 || b.y0 > b.y1))
            problem = "bank '" + b.name + "' covers sites outside the device";
        for (std::size_t j = 0; j < i && problem.empty(); ++j) {
            const Bank& o = device.banks[j];
            if (b.x0 <= o.x1 && o.x0 <= b.x1 && b.y0 <= o.y1 && o.y0 <= b.y1)
                problem = "banks '" + o.name + "' and '" + b.name + "' overlap";
        }
    }
    for (std::size_t i = 0; i < cells.size() && problem.empty(); ++i) problem = add(cells[i].name, Kind::Cell, i);
    for (std::size_t i = 0; i < nets.size() && problem.empty(); ++i) problem = add(nets[i].name, Kind::Net, i);
    for (std::size_t i = 0; i < ports.size() && problem.empty(); ++i) problem = add(ports[i].name, Kind::Port, i);
    for (std::size_t i = 0; i < clocks.size() && problem.empty(); ++i) problem = add(clocks[i].name, Kind::Clock, i);
    if (!problem.empty()) return problem;

    auto siteOk = [this](const std::string& site) { return site.empty() || device.ParseSite(site).has_value(); };
    for (const Cell& c : cells) {
        if (!siteOk(c.site)) return "cell '" + c.name + "' is placed on '" + c.site + "', which is no site of the device";
        if (c.delay < 0 || c.setup < 0) return "cell '" + c.name + "' has a negative delay";
        if (c.sequential && !c.clock.empty() && !FindClock(c.clock))
            return "cell '" + c.name + "' names the unknown clock '" + c.clock + "'";
    }
    for (const IoPort& p : ports)
        if (!siteOk(p.site)) return "port '" + p.name + "' is placed on '" + p.site + "', which is no site of the device";
    for (const Net& n : nets) {
        if (n.delay < 0) return "net '" + n.name + "' has a negative delay";
        const auto driver = Find(n.driver);
        if (!driver || (driver->kind != Kind::Cell && driver->kind != Kind::Port))
            return "net '" + n.name + "' has the unknown driver '" + n.driver + "'";
        if (driver->kind == Kind::Port && ports[driver->index].output)
            return "net '" + n.name + "' is driven by the output port '" + n.driver + "'";
        for (const std::string& load : n.loads) {
            const auto ref = Find(load);
            if (!ref || (ref->kind != Kind::Cell && ref->kind != Kind::Port))
                return "net '" + n.name + "' has the unknown load '" + load + "'";
            if (ref->kind == Kind::Port && !ports[ref->index].output)
                return "net '" + n.name + "' loads the input port '" + load + "'";
        }
    }
    for (const Clock& c : clocks) {
        if (!(c.period > 0)) return "clock '" + c.name + "' needs a positive period";
        if (!c.net.empty() && !FindNet(c.net)) return "clock '" + c.name + "' drives the unknown net '" + c.net + "'";
    }
    std::set<std::string> blockNames;
    for (const Block& b : blocks) {
        if (b.name.empty() || !blockNames.insert(b.name).second) return "block names must be present and unique";
        for (const std::string& cell : b.cells)
            if (!FindCell(cell)) return "block '" + b.name + "' holds the unknown cell '" + cell + "'";
    }
    for (const std::string& site : prohibited)
        if (!device.ParseSite(site)) return "the prohibited site '" + site + "' is no site of the device";
    return {};
}

std::optional<ObjectRef> Design::Find(std::string_view objectName) const {
    if (auto it = m_index.find(objectName); it != m_index.end()) return it->second;
    if (auto site = device.ParseSite(objectName))
        return ObjectRef{Kind::Site, static_cast<std::size_t>(site->y) * static_cast<std::size_t>(device.columns) +
                                         static_cast<std::size_t>(site->x)};
    return std::nullopt;
}

namespace {
template <class T>
T* Pick(std::vector<T>& items, const std::optional<ObjectRef>& ref, Kind kind) {
    return ref && ref->kind == kind ? &items[ref->index] : nullptr;
}
}  // namespace

const Cell* Design::FindCell(std::string_view n) const { return const_cast<Design*>(this)->FindCell(n); }
const Net* Design::FindNet(std::string_view n) const { return const_cast<Design*>(this)->FindNet(n); }
const IoPort* Design::FindPort(std::string_view n) const { return const_cast<Design*>(this)->FindPort(n); }
const Clock* Design::FindClock(std::string_view n) const { return const_cast<Design*>(this)->FindClock(n); }
const Bank* Design::FindBank(std::string_view n) const {
    const auto ref = Find(n);
    return ref && ref->kind == Kind::Bank ? &device.banks[ref->index] : nullptr;
}
Cell* Design::FindCell(std::string_view n) { return Pick(cells, Find(n), Kind::Cell); }
Net* Design::FindNet(std::string_view n) { return Pick(nets, Find(n), Kind::Net); }
IoPort* Design::FindPort(std::string_view n) { return Pick(ports, Find(n), Kind::Port); }
Clock* Design::FindClock(std::string_view n) { return Pick(clocks, Find(n), Kind::Clock); }
Block* Design::FindBlock(std::string_view n) {
    for (Block& b : blocks)
        if (b.name == n) return &b;
    return nullptr;
}

std::string Design::TypeOf(std::string_view objectName) const {
    const auto ref = Find(objectName);
    return ref ? KindWord(ref->kind) : "";
}

std::optional<Properties> Design::PropertiesOf(std::string_view objectName) const {
    const auto ref = Find(objectName);
    if (!ref) return std::nullopt;
    return Collect(*ref, objectName, nullptr);
}

std::optional<std::string> Design::PropertyOf(std::string_view objectName, const std::string& property) const {
    const auto ref = Find(objectName);
    if (!ref) return std::nullopt;
    Properties one = Collect(*ref, objectName, &property);
    if (one.empty()) return std::nullopt;
    return std::move(one.begin()->second);
}

// The properties of an object, or with `only` just that one (none when the object lacks it): a value
// is worked out only when it is wanted, as some walk every net or cell of the design.
Properties Design::Collect(const ObjectRef& ref, std::string_view objectName, const std::string* only) const {
    Properties p;
    const auto own = [&](const Properties& given) {
        if (only == nullptr) {
            p = given;
        } else if (const auto it = given.find(*only); it != given.end()) {
            p.insert(*it);
        }
    };
    const auto put = [&](const char* key, auto&& value) {
        if (only == nullptr || *only == key) p[key] = value();
    };
    auto join = [](const std::vector<std::string>& words) {
        TclValue list(NewList(words));
        return list.Text();
    };
    switch (ref.kind) {
        case Kind::Cell: {
            const Cell& c = cells[ref.index];
            own(c.properties);
            put("cell_type", [&] { return c.type; });
            put("site", [&] { return c.site; });
            put("delay", [&] { return Num(c.delay); });
            put("sequential", [&] { return std::string(c.sequential ? "1" : "0"); });
            if (c.sequential) {
                put("setup", [&] { return Num(c.setup); });
                put("clock", [&] { return c.clock; });
            }
            const auto netsOf = [&](bool driven) {
                std::vector<std::string> found;
                for (const Net& n : nets)
                    if (driven ? n.driver == c.name : std::find(n.loads.begin(), n.loads.end(), c.name) != n.loads.end())
                        found.push_back(n.name);
                return join(found);
            };
            put("input_nets", [&] { return netsOf(false); });
            put("output_nets", [&] { return netsOf(true); });
            break;
        }
        case Kind::Net: {
            const Net& n = nets[ref.index];
            own(n.properties);
            put("driver", [&] { return n.driver; });
            put("loads", [&] { return join(n.loads); });
            put("fanout", [&] { return std::to_string(n.loads.size()); });
            put("delay", [&] { return Num(n.delay); });
            break;
        }
        case Kind::Port: {
            const IoPort& port = ports[ref.index];
            own(port.properties);
            put("direction", [&] { return std::string(port.output ? "out" : "in"); });
            put("site", [&] { return port.site; });
            put("standard", [&] { return port.standard; });
            put("bank", [&] {
                std::string bank;
                if (auto s = device.ParseSite(port.site))
                    if (const Bank* b = device.BankOf(s->x, s->y)) bank = b->name;
                return bank;
            });
            break;
        }
        case Kind::Clock: {
            const Clock& c = clocks[ref.index];
            own(c.properties);
            put("period", [&] { return Num(c.period); });
            put("frequency_mhz", [&] { return Num(1000.0 / c.period); });
            put("net", [&] { return c.net; });
            break;
        }
        case Kind::Bank: {
            const Bank& b = device.banks[ref.index];
            put("x0", [&] { return std::to_string(b.x0); });
            put("y0", [&] { return std::to_string(b.y0); });
            put("x1", [&] { return std::to_string(b.x1); });
            put("y1", [&] { return std::to_string(b.y1); });
            put("sso_limit", [&] { return std::to_string(b.ssoLimit); });
            put("sites", [&] {
                return std::to_string((static_cast<long long>(b.x1) - b.x0 + 1) * (static_cast<long long>(b.y1) - b.y0 + 1));
            });
            break;
        }
        case Kind::Site: {
            const int x = static_cast<int>(ref.index % static_cast<std::size_t>(device.columns));
            const int y = static_cast<int>(ref.index / static_cast<std::size_t>(device.columns));
            const std::string siteName = Device::SiteName(x, y);
            put("x", [&] { return std::to_string(x); });
            put("y", [&] { return std::to_string(y); });
            put("bank", [&] {
                const Bank* b = device.BankOf(x, y);
                return b ? b->name : std::string();
            });
            put("occupants", [&] {
                std::vector<std::string> occupants;
                for (const Cell& c : cells)
                    if (c.site == siteName) occupants.push_back(c.name);
                for (const IoPort& port : ports)
                    if (port.site == siteName) occupants.push_back(port.name);
                return join(occupants);
            });
            put("prohibited", [&] { return std::string(prohibited.count(siteName) ? "1" : "0"); });
            break;
        }
    }
    put("name", [&] { return std::string(objectName); });
    put("type", [&] { return std::string(KindWord(ref.kind)); });
    return p;
}

// ---------------------------------------------------------------------------------------------

const char* SettingTypeWord(SettingType type) noexcept {
    switch (type) {
        case SettingType::Bool: return "bool";
        case SettingType::Int: return "int";
        case SettingType::Double: return "double";
        case SettingType::String: return "string";
        case SettingType::Color: return "color";
        case SettingType::Choice: return "choice";
    }
    return "string";
}

namespace {

constexpr std::array<const char*, 16> kColorNames{"black", "white", "red",    "green",  "blue",   "yellow",
                                                  "cyan",  "magenta", "orange", "purple", "pink", "brown",
                                                  "gray",  "grey",  "lime",   "navy"};

// The canonical text of `text` read as `type`, or nothing.
std::optional<std::string> Canonical(const Setting& s, const std::string& text) {
    TclValue value(NewText(text));
    switch (s.type) {
        case SettingType::Bool: {
            int b = 0;
            if (Tcl_GetBooleanFromObj(nullptr, value.get(), &b) != TCL_OK) return std::nullopt;
            return b ? "1" : "0";
        }
        case SettingType::Int: {
            Tcl_WideInt i = 0;
            if (Tcl_GetWideIntFromObj(nullptr, value.get(), &i) != TCL_OK) return std::nullopt;
            return std::to_string(i);
        }
        case SettingType::Double: {
            double d = 0;
            if (Tcl_GetDoubleFromObj(nullptr, value.get(), &d) != TCL_OK || !std::isfinite(d)) return std::nullopt;
            return Num(d);
        }
        case SettingType::Color: return CanonicalColor(text);
        case SettingType::Choice:
            if (std::find(s.choices.begin(), s.choices.end(), text) == s.choices.end()) return std::nullopt;
            return text;
        case SettingType::String: return text;
    }
    return std::nullopt;
}

}  // namespace

std::optional<std::string> CanonicalColor(std::string_view text) {
    std::string lower(text);
    for (char& c : lower) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    if (lower.size() == 7 && lower[0] == '#' &&
        std::all_of(lower.begin() + 1, lower.end(), [](char c) { return std::isxdigit(static_cast<unsigned char>(c)); }))
        return lower;
    for (const char* name : kColorNames)
        if (lower == name) return lower;
    return std::nullopt;
}

void SettingTable::Define(const std::string& settingName, SettingType type, const std::string& value,
                          const std::string& description, std::vector<std::string> choices) {
    Setting s;
    s.type = type;
    s.value = value;
    s.defaultValue = value;
    s.description = description;
    s.choices = std::move(choices);
    s.builtIn = true;
    m_settings[settingName] = std::move(s);
}

void SettingTable::Define(const std::string& settingName, SettingType type, const std::string& value,
                          const std::string& description, Setting::Bounds bounds) {
    Define(settingName, type, value, description);
    m_settings[settingName].bounds = bounds;
}

std::string SettingTable::Set(const std::string& settingName, const std::string& text, bool allowNew) {
    auto it = m_settings.find(settingName);
    if (it == m_settings.end()) {
        if (!allowNew) return "unknown setting '" + settingName + "'";
        if (settingName.empty()) return "a setting needs a name";
        Setting s;
        s.value = text;
        s.description = "set by a script";
        m_settings.emplace(settingName, std::move(s));
        return {};
    }
    Setting& s = it->second;
    auto value = Canonical(s, text);
    if (!value) {
        std::string expected = std::string("a value of type ") + SettingTypeWord(s.type);
        if (s.type == SettingType::Color) expected = "a colour name or #rrggbb";
        if (s.type == SettingType::Choice) {
            TclValue list(NewList(s.choices));
            expected = "one of: " + list.Text();
        }
        return "bad value '" + text + "' for setting '" + settingName + "': expected " + expected;
    }
    if (s.bounds) {
        const double number = std::strtod(value->c_str(), nullptr);
        if (number < s.bounds->low || number > s.bounds->high)
            return "bad value '" + text + "' for setting '" + settingName + "': expected a value from " +
                   Num(s.bounds->low) + " to " + Num(s.bounds->high);
    }
    s.value = *value;
    return {};
}

std::string SettingTable::Unset(const std::string& settingName) {
    auto it = m_settings.find(settingName);
    if (it == m_settings.end()) return "unknown setting '" + settingName + "'";
    if (it->second.builtIn)
        it->second.value = it->second.defaultValue;
    else
        m_settings.erase(it);
    return {};
}

const Setting* SettingTable::Find(const std::string& settingName) const {
    auto it = m_settings.find(settingName);
    return it == m_settings.end() ? nullptr : &it->second;
}

long long SettingTable::Integer(const std::string& settingName, long long fallback) const {
    const Setting* s = Find(settingName);
    long long n = 0;
    if (s == nullptr ||
        std::from_chars(s->value.data(), s->value.data() + s->value.size(), n).ec != std::errc())
        return fallback;
    return n;
}

double SettingTable::Number(const std::string& settingName, double fallback) const {
    const Setting* s = Find(settingName);
    char* end = nullptr;
    const double d = s ? std::strtod(s->value.c_str(), &end) : fallback;
    return s && end != s->value.c_str() && std::isfinite(d) ? d : fallback;
}

}  // namespace kelmartool
