// Search of design objects by name: a glob pattern by default, the exact name with -exactmatch, a
// regular expression with -regexp (or -exp); case matters only with -matchcase. The type list
// filters by kind, the in list names where to look: the project, the selection, the highlight or
// collections.
#include <algorithm>
#include <cctype>
#include <optional>
#include <set>
#include <string_view>

#include "TcltaskI/ISearch.h"
#include "component.h"
#include "property.h"
#include "roots.h"

namespace kelmartool {

namespace {

constexpr Kind kAllKinds[] = {Kind::Cell, Kind::Net, Kind::Port, Kind::Clock, Kind::Bank, Kind::Site};

// Sites a search may test one by one. A device of 100000 x 100000 has ten billion; a search that
// would test more than this many (a few seconds of work) is refused with a message rather than run
// for hours. Sites named outright and globs that no site name can match need no walk at all.
constexpr long long kMostSitesTested = 10'000'000;
// Tcl compiles a regular expression in time that grows faster than its length: 4096 characters
// take a tenth of a second, 65536 a minute and a half. Names are short; longer expressions are
// refused.
constexpr std::size_t kLongestExpression = 4096;

// How the sites of a device can match a search text.
struct SiteSearch {
    enum { Named, None, Walk } how = Walk;
    std::string name;  // for Named: the one site name the text can match, in the case of the device
};

SiteSearch HowSitesMatch(const std::string& text, bool matchcase, bool exact, bool byExpression) {
    if (byExpression) return {};
    const auto siteCase = [matchcase](std::string name) {
        if (!matchcase)
            for (char& c : name) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
        return name;
    };
    if (exact) return {SiteSearch::Named, siteCase(text)};
    // A glob: its literal characters (an escaped one too) must all occur in site names, which are
    // X<column>Y<row>; without * ? or [...] it names one site at most.
    const std::string_view siteCharacters = matchcase ? "XY0123456789" : "XYxy0123456789";
    std::string literal;
    bool wild = false;
    for (std::size_t i = 0; i < text.size(); ++i) {
        char c = text[i];
        if (c == '*' || c == '?') {
            wild = true;
            continue;
        }
        if (c == '[') {
            wild = true;
            i = std::min(text.find(']', i + 1), text.size());
            continue;
        }
        if (c == '\\' && i + 1 < text.size()) c = text[++i];
        if (siteCharacters.find(c) == std::string_view::npos) return {SiteSearch::None, {}};
        literal += c;
    }
    if (wild) return {};
    return {SiteSearch::Named, siteCase(literal)};
}

class Search final : public Component<TcltaskI::ISearch> {
public:
    explicit Search(const StatePtr& state) : m_state(state) {}

    CommonI::RESULT search(const Str& text, bool matchcase, bool exactmatch, bool regexp, bool exp, const List& type,
                           const List& in, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        const Design* design = m_state->CurrentDesign();
        if (design == nullptr) return Refuse(*m_state, message, Refusal::NoProject, kNoProject);
        const bool byExpression = regexp || exp;
        if (exactmatch && byExpression)
            return Refuse(*m_state, message, Refusal::Value, "search takes -exactmatch or -regexp, not both");

        std::set<Kind> kinds;
        std::vector<std::string> words;
        if (!WordsOf(type, words)) return Refuse(*m_state, message, Refusal::Value, "-type expects object kinds");
        for (const std::string& w : words) {
            if (w == "all") {
                kinds.insert(std::begin(kAllKinds), std::end(kAllKinds));
            } else if (auto kind = KindFromWord(w)) {
                kinds.insert(*kind);
            } else {
                return Refuse(*m_state, message, Refusal::Value,
                              "unknown object type '" + w + "': expected all, cell, net, port, clock, bank or site");
            }
        }

        std::vector<std::string> scopes;
        if (!WordsOf(in, scopes)) return Refuse(*m_state, message, Refusal::Value, "-in expects scopes");
        for (const std::string& scope : scopes)
            if (scope != "project" && scope != "selection" && scope != "highlight" && !m_state->collections.count(scope))
                return Refuse(*m_state, message, Refusal::Value,
                              "unknown search scope '" + scope +
                                  "': expected project, selection, highlight or the name of a collection");

        Tcl_RegExp expression = nullptr;
        TclValue pattern(NewText(text.c_str()));
        if (byExpression) {
            if (text.Length() > static_cast<int32_t>(kLongestExpression))
                return Refuse(*m_state, message, Refusal::Limit,
                              "a regular expression of at most " + std::to_string(kLongestExpression) +
                                  " characters is taken, not " + std::to_string(text.Length()));
            const int flags = TCL_REG_ADVANCED | (matchcase ? 0 : TCL_REG_NOCASE);
            expression = Tcl_GetRegExpFromObj(m_state->interp, pattern.get(), flags);
            if (expression == nullptr) {
                std::string why = Tcl_GetStringResult(m_state->interp);
                Tcl_ResetResult(m_state->interp);
                return Refuse(*m_state, message, Refusal::Value,
                              "bad regular expression '" + std::string(text.c_str()) + "': " + why);
            }
        }

        // The scopes are walked in order and every candidate tested as it comes: only the hits are
        // kept, each once, and the walk ends when search_limit has them all.
        const auto limit = static_cast<std::size_t>(m_state->settings.Integer("search_limit", 0));
        std::vector<std::string> hits;
        std::set<std::string> seen;
        auto offer = [&](const std::string& name, Kind kind) {
            if (kinds.count(kind) && !seen.count(name) && Matches(name, text.c_str(), matchcase, exactmatch, expression)) {
                seen.insert(name);
                hits.push_back(name);
            }
            return limit == 0 || hits.size() < limit;
        };
        auto offerNames = [&](const auto& names) {
            for (const std::string& name : names)
                if (!offer(name, design->Find(name)->kind)) return false;
            return true;
        };
        const SiteSearch sites = HowSitesMatch(text.c_str(), matchcase, exactmatch, byExpression);
        bool more = true;
        for (std::size_t i = 0; i < scopes.size() && more; ++i) {
            const std::string& scope = scopes[i];
            if (scope == "project") {
                for (Kind kind : kAllKinds) {
                    if (!more || !kinds.count(kind)) continue;
                    if (kind != Kind::Site) {
                        more = OfferObjects(*design, kind, offer);
                    } else if (sites.how == SiteSearch::Named) {
                        if (const auto site = design->device.ParseSite(sites.name))
                            more = offer(Device::SiteName(*site), Kind::Site);
                    } else if (sites.how == SiteSearch::Walk) {
                        // Without a limit the walk tests every site: refused before it starts.
                        const auto walked = limit == 0 && SiteCount(design->device) > kMostSitesTested
                                                ? std::nullopt
                                                : OfferSites(design->device, offer);
                        if (!walked)
                            return Refuse(*m_state, message, Refusal::Limit,
                                          "search would test more than " + std::to_string(kMostSitesTested) +
                                              " of the " + std::to_string(SiteCount(design->device)) +
                                              " sites of the device against '" + text.c_str() +
                                              "': name one site, leave sites out with -type, or set "
                                              "search_limit");
                        more = *walked;
                    }
                }
            } else if (scope == "selection") {
                more = offerNames(m_state->selection);
            } else if (scope == "highlight") {
                for (auto it = m_state->highlight.begin(); it != m_state->highlight.end() && more; ++it)
                    more = offer(it->first, design->Find(it->first)->kind);
            } else {
                more = offerNames(m_state->collections.at(scope));
            }
        }
        return Answer(NewList(hits), result, message);
    }

private:
    static long long SiteCount(const Device& device) {
        return static_cast<long long>(device.columns) * device.rows;
    }

    // Offers every object of one kind but sites; false once `offer` wants no more.
    template <class Offer>
    static bool OfferObjects(const Design& design, Kind kind, Offer& offer) {
        auto each = [&](const auto& items) {
            for (const auto& item : items)
                if (!offer(item.name, kind)) return false;
            return true;
        };
        switch (kind) {
            case Kind::Cell: return each(design.cells);
            case Kind::Net: return each(design.nets);
            case Kind::Port: return each(design.ports);
            case Kind::Clock: return each(design.clocks);
            case Kind::Bank: return each(design.device.banks);
            case Kind::Site: break;
        }
        return true;
    }

    // Offers the sites row by row, each name made when it is tested; false once `offer` wants no
    // more, nothing when more than kMostSitesTested sites would be tested.
    template <class Offer>
    static std::optional<bool> OfferSites(const Device& device, Offer& offer) {
        long long tested = 0;
        for (int y = 0; y < device.rows; ++y)
            for (int x = 0; x < device.columns; ++x) {
                if (tested++ == kMostSitesTested) return std::nullopt;
                if (!offer(Device::SiteName(x, y), Kind::Site)) return false;
            }
        return true;
    }

    bool Matches(const std::string& name, const char* text, bool matchcase, bool exact, Tcl_RegExp expression) const {
        if (expression != nullptr) {
            TclValue subject(NewText(name));
            return Tcl_RegExpExecObj(m_state->interp, expression, subject.get(), 0, 0, 0) == 1;
        }
        if (exact) {
            if (matchcase) return name == text;
            const std::string_view t(text);
            return name.size() == t.size() && std::equal(name.begin(), name.end(), t.begin(), [](char a, char b) {
                       return std::tolower(static_cast<unsigned char>(a)) == std::tolower(static_cast<unsigned char>(b));
                   });
        }
        return Tcl_StringCaseMatch(name.c_str(), text, matchcase ? 0 : TCL_MATCH_NOCASE) != 0;
    }

    StatePtr m_state;
};

}  // namespace

CitI::IInterface* NewSearch(const StatePtr& state) { return static_cast<TcltaskI::ISearch*>(new Search(state)); }

}  // namespace kelmartool
