// The tool state of one interpreter: its settings and the parts that refer to the current design.
#include <algorithm>
#include <cstdint>
#include <limits>

#include "design.h"
#include "project.h"
#include "property.h"

namespace kelmartool {

ToolState::ToolState(Tcl_Interp* owner) : interp(owner) {
    // The bounds are what the commands reading the settings work with: counts that an int holds,
    // the percentages pan -percentage takes, a zoom that changes the view by at most a thousand.
    constexpr double kMostCount = std::numeric_limits<int32_t>::max();
    settings.Define("search_limit", SettingType::Int, "0", "most hits a search gives; 0 gives all",
                    Setting::Bounds{0, kMostCount});
    settings.Define("zoom_factor", SettingType::Double, "2", "how much zoom -in and -out magnify or shrink the view",
                    Setting::Bounds{1, 1000});
    settings.Define("pan_percentage", SettingType::Int, "50", "how far pan moves, in percent of the view, when not given",
                    Setting::Bounds{1, 1000});
    settings.Define("max_paths", SettingType::Int, "5", "worst paths a timing analysis reports",
                    Setting::Bounds{0, kMostCount});

    highlightSettings.Define("default_highlight_color", SettingType::Color, "yellow",
                             "colour of highlight add when no -color is given");
    highlightSettings.Define("max_items", SettingType::Int, "0", "most objects highlighted at once; 0 is no limit",
                             Setting::Bounds{0, kMostCount});

    selectionSettings.Define("filter", SettingType::Choice, "all", "the only kind of object that can be selected",
                             {"all", "cell", "net", "port", "clock", "bank", "site"});
    selectionSettings.Define("max_items", SettingType::Int, "0", "most objects selected at once; 0 is no limit",
                             Setting::Bounds{0, kMostCount});
}

ToolState::~ToolState() = default;

ProjectComponent* ToolState::Current() const noexcept {
    return projects.empty() ? nullptr : static_cast<ProjectComponent*>(projects.back().get());
}

Design* ToolState::CurrentDesign() const noexcept {
    ProjectComponent* current = Current();
    return current ? current->GetDesign() : nullptr;
}

namespace {

// The idle callback of Changed: runs the state's script at the global level, once for the changes
// since the last run. The changes the script makes itself do not schedule it again: a script that
// changes what it watches would run in every idle pass, and `update idletasks` would never return.
// The interpreter is preserved, so that a script that deletes it returns here before it goes (and
// the state with it); its errors are the interpreter's background errors.
void RunOnChange(ClientData data) {
    auto* state = static_cast<ToolState*>(data);
    Tcl_Interp* interp = state->interp;
    if (interp == nullptr || !state->onChange) {
        state->onChangePending = false;
        return;
    }
    const Script::TclObjRef script = state->onChange;  // the script may replace itself
    Tcl_Preserve(interp);
    const int code = Tcl_EvalObjEx(interp, script.get(), TCL_EVAL_GLOBAL);
    state->onChangePending = false;
    if (code != TCL_OK) Tcl_BackgroundException(interp, code);
    Tcl_Release(interp);
}

}  // namespace

void ToolState::Changed() {
    ++changes;
    if (interp == nullptr || !onChange || onChangePending) return;
    onChangePending = true;
    Tcl_DoWhenIdle(RunOnChange, this);
}

void ToolState::DesignChanged() {
    ++designEpoch;
    Changed();
    const Design* design = CurrentDesign();
    auto gone = [design](const std::string& name) { return design == nullptr || !design->Find(name); };
    std::erase_if(selection, gone);
    std::erase_if(highlight, [&gone](const auto& entry) { return gone(entry.first); });
    for (auto& [name, members] : collections) std::erase_if(members, gone);
    if (design == nullptr) collections.clear();
    view = ViewState{};
    if (design != nullptr)
        view.history.push_back(Viewport{0, 0, static_cast<double>(design->device.columns),
                                        static_cast<double>(design->device.rows)});
}

void ToolState::Shutdown() {
    // A project may hold registered components that hold this state, another project or the project
    // itself: each one lets go of its design and its components first, which breaks every cycle.
    auto open = std::move(projects);
    projects.clear();
    for (auto& project : open) static_cast<ProjectComponent*>(project.get())->Drop();
    open.clear();
    timing.reset();
    floorplan.reset();
    collections.clear();
    highlight.clear();
    selection.clear();
    if (onChangePending) Tcl_CancelIdleCall(RunOnChange, this);
    onChangePending = false;
    onChange = Script::TclObjRef();
    interp = nullptr;
}

bool Alive(const ToolState& state, Port_String& message) {
    return state.interp != nullptr || Fail(message, kStateGone) != 0;
}

namespace {

const char* RefusalWord(Refusal kind) {
    switch (kind) {
        case Refusal::NoProject: return "NOPROJECT";
        case Refusal::Unknown: return "UNKNOWN";
        case Refusal::File: return "FILE";
        case Refusal::State: return "STATE";
        case Refusal::Limit: return "LIMIT";
        case Refusal::Value: return "VALUE";
        case Refusal::Script: return "SCRIPT";
        case Refusal::NoDisplay: return "NODISPLAY";
    }
    return "VALUE";
}

}  // namespace

void SetRefusal(const ToolState& state, Refusal kind, std::initializer_list<std::string_view> more) {
    if (state.interp == nullptr) return;
    Tcl_Obj* code = NewList({NewText("KELMAR"), NewText("TOOL"), NewText(RefusalWord(kind))});
    for (std::string_view word : more) Tcl_ListObjAppendElement(nullptr, code, NewText(word));
    Tcl_SetObjErrorCode(state.interp, code);
}

CommonI::RESULT Refuse(const ToolState& state, Port_String& message, Refusal kind, const std::string& text) {
    SetRefusal(state, kind);
    return Fail(message, text);
}

CommonI::RESULT Refuse(const ToolState& state, Port_String& message, Refusal kind,
                       std::initializer_list<std::string_view> more, const std::string& text) {
    SetRefusal(state, kind, more);
    return Fail(message, text);
}

const std::vector<std::string>* ResolveView(const ToolState& state, Tcl_Obj* value, std::vector<std::string>& own,
                                            std::string& error) {
    const Design* design = state.CurrentDesign();
    if (design == nullptr) {
        SetRefusal(state, Refusal::NoProject);
        error = kNoProject;
        return nullptr;
    }
    own.clear();
    const char* whole = Tcl_GetString(value);
    if (auto it = state.collections.find(std::string_view(whole)); it != state.collections.end()) return &it->second;
    int count = 0;
    Tcl_Obj** items = nullptr;
    if (Tcl_ListObjGetElements(nullptr, value, &count, &items) != TCL_OK) {
        SetRefusal(state, Refusal::Value);
        error = std::string("'") + whole + "' is neither a collection nor a list of objects";
        return nullptr;
    }
    for (int i = 0; i < count; ++i) {
        const std::string_view word = Tcl_GetString(items[i]);
        if (auto it = state.collections.find(word); it != state.collections.end()) {
            own.insert(own.end(), it->second.begin(), it->second.end());
        } else if (design->Find(word)) {
            own.emplace_back(word);
        } else {
            SetRefusal(state, Refusal::Unknown, {"OBJECT", word});
            error = "unknown object '" + std::string(word) + "'";
            return nullptr;
        }
    }
    return &own;
}

bool ResolveObjects(const ToolState& state, Tcl_Obj* value, std::vector<std::string>& names, std::string& error) {
    const std::vector<std::string>* found = ResolveView(state, value, names, error);
    if (found == nullptr) return false;
    if (found != &names) names = *found;
    return true;
}

}  // namespace kelmartool
