// Search of design objects by name: a glob pattern by default, the exact name with -exactmatch, a
// regular expression with -regexp (or -exp); case matters only with -matchcase. The type list
// filters by kind, the in list names where to look: the project, the selection, the highlight or
// collections.
#include <algorithm>
#include <set>

#include "TcltaskI/ISearch.h"
#include "component.h"
#include "property.h"
#include "roots.h"

namespace kelmartool {

namespace {

constexpr Kind kAllKinds[] = {Kind::Cell, Kind::Net, Kind::Port, Kind::Clock, Kind::Bank, Kind::Site};

class Search final : public Component<TcltaskI::ISearch> {
public:
    explicit Search(const StatePtr& state) : m_state(state) {}

    CommonI::RESULT search(const Str& text, bool matchcase, bool exactmatch, bool regexp, bool exp, const List& type,
                           const List& in, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        const Design* design = m_state->CurrentDesign();
        if (design == nullptr) return Fail(message, kNoProject);
        const bool byExpression = regexp || exp;
        if (exactmatch && byExpression) return Fail(message, "search takes -exactmatch or -regexp, not both");

        std::set<Kind> kinds;
        std::vector<std::string> words;
        if (!WordsOf(type, words)) return Fail(message, "-type expects object kinds");
        for (const std::string& w : words) {
            if (w == "all") {
                kinds.insert(std::begin(kAllKinds), std::end(kAllKinds));
            } else if (auto kind = KindFromWord(w)) {
                kinds.insert(*kind);
            } else {
                return Fail(message, "unknown object type '" + w + "': expected all, cell, net, port, clock, bank or site");
            }
        }

        // The candidates, in the order of their scope, each once.
        std::vector<std::string> candidates;
        std::set<std::string> seen;
        auto offer = [&](const std::string& name) {
            if (seen.insert(name).second) candidates.push_back(name);
        };
        words.clear();
        if (!WordsOf(in, words)) return Fail(message, "-in expects scopes");
        for (const std::string& scope : words) {
            if (scope == "project") {
                for (Kind kind : kAllKinds)
                    if (kinds.count(kind))
                        for (const std::string& name : design->Names(kind)) offer(name);
            } else if (scope == "selection") {
                for (const std::string& name : m_state->selection) offer(name);
            } else if (scope == "highlight") {
                for (const auto& entry : m_state->highlight) offer(entry.first);
            } else if (auto it = m_state->collections.find(scope); it != m_state->collections.end()) {
                for (const std::string& name : it->second) offer(name);
            } else {
                return Fail(message, "unknown search scope '" + scope +
                                         "': expected project, selection, highlight or the name of a collection");
            }
        }

        Tcl_RegExp expression = nullptr;
        TclValue pattern(NewText(text.c_str()));
        if (byExpression) {
            const int flags = TCL_REG_ADVANCED | (matchcase ? 0 : TCL_REG_NOCASE);
            expression = Tcl_GetRegExpFromObj(m_state->interp, pattern.get(), flags);
            if (expression == nullptr) {
                std::string why = Tcl_GetStringResult(m_state->interp);
                Tcl_ResetResult(m_state->interp);
                return Fail(message, "bad regular expression '" + std::string(text.c_str()) + "': " + why);
            }
        }

        const Setting* limitSetting = m_state->settings.Find("search_limit");
        const std::size_t limit = limitSetting ? std::stoull(limitSetting->value) : 0;
        std::vector<std::string> hits;
        for (const std::string& name : candidates) {
            if (limit != 0 && hits.size() >= limit) break;
            if (!kinds.count(design->Find(name)->kind)) continue;
            if (Matches(name, text.c_str(), matchcase, exactmatch, expression)) hits.push_back(name);
        }
        return Answer(NewList(hits), result, message);
    }

private:
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
