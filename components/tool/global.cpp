// Global settings: typed values that a script can set, read, restore and list.
#include "TcltaskI/IGlobal.h"
#include "component.h"
#include "property.h"
#include "roots.h"

namespace kelmartool {

Tcl_Obj* SettingsValue(const SettingTable& table, bool descriptors) {
    if (!descriptors) {
        DictBuilder dict;
        for (const auto& [name, setting] : table.All()) dict.Add(name, setting.value);
        return dict.Take();
    }
    return ListOf(table.All(), [](const auto& entry) {
        const auto& [name, setting] = entry;
        DictBuilder d;
        d.Add("name", name).Add("type", SettingTypeWord(setting.type)).Add("description", setting.description);
        d.Add("value", setting.value);
        if (!setting.choices.empty()) d.Add("choices", NewList(setting.choices));
        return d.Take();
    });
}

CommonI::RESULT SetSetting(const ToolState& state, SettingTable& table, const std::string& name,
                           const std::string& text, bool allowNew, UtilI::MITclProperty& result, Port_String& message) {
    if (std::string error = table.Set(name, text, allowNew); !error.empty()) {
        if (!allowNew && table.Find(name) == nullptr)
            return Refuse(state, message, Refusal::Unknown, {"SETTING", name}, error);
        return Refuse(state, message, Refusal::Value, error);
    }
    return Answer(NewText(table.Find(name)->value), result, message);
}

CommonI::RESULT GetSetting(const ToolState& state, const SettingTable& table, const std::string& name, const char* what,
                           UtilI::MITclProperty& result, Port_String& message) {
    const Setting* setting = table.Find(name);
    if (setting == nullptr)
        return Refuse(state, message, Refusal::Unknown, {"SETTING", name},
                      std::string("unknown ") + what + " '" + name + "'");
    return Answer(NewText(setting->value), result, message);
}

namespace {

class Global final : public Component<TcltaskI::IGlobal> {
public:
    explicit Global(const StatePtr& state) : m_state(state) {}

    CommonI::RESULT set(const Str& name, const Prop& value, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return SetSetting(*m_state, m_state->settings, name.c_str(), TextOf(value), true, result, message);
    }

    CommonI::RESULT unset(const Str& name, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        if (std::string error = m_state->settings.Unset(name.c_str()); !error.empty())
            return Refuse(*m_state, message, Refusal::Unknown, {"SETTING", name.c_str()}, error);
        const Setting* restored = m_state->settings.Find(name.c_str());
        if (restored == nullptr) return 1;  // a script's own setting is gone
        return Answer(NewText(restored->value), result, message);
    }

    CommonI::RESULT get(const Str& name, Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return GetSetting(*m_state, m_state->settings, name.c_str(), "setting", result, message);
    }

    CommonI::RESULT properties(Out& result, Msg& message) override {
        if (!Alive(*m_state, message)) return 0;
        return Answer(SettingsValue(m_state->settings, false), result, message);
    }

private:
    StatePtr m_state;
};

}  // namespace

CitI::IInterface* NewGlobal(const StatePtr& state) { return static_cast<TcltaskI::IGlobal*>(new Global(state)); }

}  // namespace kelmartool
