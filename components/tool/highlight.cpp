// The highlight: design objects shown in a colour, and the highlight's own settings.
#include "TcltaskI/IHighlight.h"
#include "component.h"
#include "marking.h"
#include "roots.h"

namespace kelmartool {

namespace {

class Highlight final : public Component<TcltaskI::IHighlight> {
public:
    explicit Highlight(const StatePtr& state) : m_state(state) {}

    CommonI::RESULT add(const List& items, const Str& color, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return Mark(items, color, false, result, message);
    }

    CommonI::RESULT remove(const List& items, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::vector<std::string> names;
        if (!ResolveItems(*m_state, items, names, message)) return 0;
        for (const std::string& name : names) m_state->highlight.erase(name);
        m_state->Changed();
        return Answer(NewInt(static_cast<long long>(m_state->highlight.size())), result, message);
    }

    CommonI::RESULT new_(const List& items, const Str& color, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return Mark(items, color, true, result, message);
    }

    CommonI::RESULT current(Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        DictBuilder dict;
        for (const auto& [name, color] : m_state->highlight) dict.Add(name, color);
        return Answer(dict.Take(), result, message);
    }

    CommonI::RESULT clear(Out&, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        m_state->highlight.clear();
        m_state->Changed();
        return 1;
    }

    CommonI::RESULT set(const Str& name, const Prop& value, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return SetSetting(*m_state, m_state->highlightSettings, name.c_str(), TextOf(value), false, result, message);
    }

    // Answers without an open project: the default of `highlight add -color` asks on every call.
    CommonI::RESULT get(const Str& name, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return GetSetting(*m_state, m_state->highlightSettings, name.c_str(), "highlight setting", result, message);
    }

    CommonI::RESULT properties(bool descriptors, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return Answer(SettingsValue(m_state->highlightSettings, descriptors), result, message);
    }

private:
    CommonI::RESULT Mark(const List& items, const Str& color, bool replace, Out& result, Msg& message) {
        std::string colour = color.c_str();
        if (colour.empty()) colour = m_state->highlightSettings.Find("default_highlight_color")->value;
        auto canonical = CanonicalColor(colour);
        if (!canonical)
            return Refuse(*m_state, message, Refusal::Value,
                          "bad colour '" + colour + "': expected a colour name or #rrggbb");
        std::vector<std::string> names;
        if (!ResolveItems(*m_state, items, names, message)) return 0;
        auto marked = replace ? std::map<std::string, std::string>{} : m_state->highlight;
        for (const std::string& name : names) marked[name] = *canonical;
        if (std::size_t limit = MaxItems(m_state->highlightSettings); limit != 0 && marked.size() > limit)
            return Refuse(*m_state, message, Refusal::Limit,
                          "the highlight would hold " + std::to_string(marked.size()) +
                              " objects, more than max_items " + std::to_string(limit));
        m_state->highlight = std::move(marked);
        m_state->Changed();
        return Answer(NewInt(static_cast<long long>(m_state->highlight.size())), result, message);
    }

    StatePtr m_state;
};

}  // namespace

CitI::IInterface* NewHighlight(const StatePtr& state) {
    return static_cast<TcltaskI::IHighlight*>(new Highlight(state));
}

}  // namespace kelmartool
