// The selection: design objects in the order they were selected, limited by its settings.
#include <algorithm>

#include "TcltaskI/ISelection.h"
#include "component.h"
#include "marking.h"
#include "roots.h"

namespace kelmartool {

namespace {

class Selection final : public Component<TcltaskI::ISelection> {
public:
    explicit Selection(const StatePtr& state) : m_state(state) {}

    CommonI::RESULT add(const List& items, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return Select(items, false, result, message);
    }

    CommonI::RESULT remove(const List& items, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        std::vector<std::string> names;
        if (!ResolveItems(*m_state, items, names, message)) return 0;
        std::erase_if(m_state->selection,
                      [&names](const std::string& s) { return std::find(names.begin(), names.end(), s) != names.end(); });
        m_state->Changed();
        return Answer(NewList(m_state->selection), result, message);
    }

    CommonI::RESULT new_(const List& items, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return Select(items, true, result, message);
    }

    CommonI::RESULT current(Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return Answer(NewList(m_state->selection), result, message);
    }

    CommonI::RESULT clear(Out&, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        m_state->selection.clear();
        m_state->Changed();
        return 1;
    }

    CommonI::RESULT set(const Str& name, const Prop& value, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return SetSetting(*m_state, m_state->selectionSettings, name.c_str(), TextOf(value), false, result, message);
    }

    CommonI::RESULT get(const Str& name, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return GetSetting(*m_state, m_state->selectionSettings, name.c_str(), "selection setting", result, message);
    }

    CommonI::RESULT properties(bool descriptors, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return Answer(SettingsValue(m_state->selectionSettings, descriptors), result, message);
    }

private:
    CommonI::RESULT Select(const List& items, bool replace, Out& result, Msg& message) {
        std::vector<std::string> names;
        if (!ResolveItems(*m_state, items, names, message)) return 0;
        const std::string filter = m_state->selectionSettings.Find("filter")->value;
        const Design& design = *m_state->CurrentDesign();
        for (const std::string& name : names)
            if (filter != "all" && design.TypeOf(name) != filter)
                return Refuse(*m_state, message, Refusal::Value,
                              "'" + name + "' is a " + design.TypeOf(name) + ", but the selection filter admits only " +
                                  filter + " objects");
        auto selected = replace ? std::vector<std::string>{} : m_state->selection;
        for (std::string& name : names)
            if (std::find(selected.begin(), selected.end(), name) == selected.end()) selected.push_back(std::move(name));
        if (std::size_t limit = MaxItems(m_state->selectionSettings); limit != 0 && selected.size() > limit)
            return Refuse(*m_state, message, Refusal::Limit,
                          "the selection would hold " + std::to_string(selected.size()) +
                              " objects, more than max_items " + std::to_string(limit));
        m_state->selection = std::move(selected);
        m_state->Changed();
        return Answer(NewList(m_state->selection), result, message);
    }

    StatePtr m_state;
};

}  // namespace

CitI::IInterface* NewSelection(const StatePtr& state) {
    return static_cast<TcltaskI::ISelection*>(new Selection(state));
}

}  // namespace kelmartool
