// What the highlight and the selection share: turning item properties into object names.
#pragma once

#include "design.h"
#include "property.h"

namespace kelmartool {

// Every object the items name, in order, each once. False with `message` set when one is unknown
// or no project is open.
inline bool ResolveItems(const ToolState& state, const UtilI::TclPropertyList& items, std::vector<std::string>& names,
                         Port_String& message) {
    std::set<std::string> seen;
    for (const auto& item : items) {
        TclValue value = ValueOf(item);
        if (!value) value = TclValue(NewText(""));
        std::vector<std::string> some;
        std::string error;
        if (!ResolveObjects(state, value.get(), some, error)) {
            message = error.c_str();
            return false;
        }
        for (std::string& name : some)
            if (seen.insert(name).second) names.push_back(std::move(name));
    }
    return true;
}

// The limit of a settings table's max_items; 0 is none.
inline std::size_t MaxItems(const SettingTable& table) {
    return static_cast<std::size_t>(std::max(0LL, table.Integer("max_items", 0)));
}

}  // namespace kelmartool
