// kelmartool::scene ?-rect {x0 y0 x1 y1}? ?-nets all|marked|none?: the scene as a list of dicts
// (kind, name, coords, fill, outline, label, layer), of the view's rectangle unless -rect gives one.
// kelmartool::shown: the view's rectangle as {x0 y0 x1 y1} in sites, the one scene and snapshot draw.
// kelmartool::snapshot FILE ?-width PX? ?-height PX? ?-nets WHICH? ?-format svg|png?: the view's
// rectangle written as SVG, or as PNG through Tk. With one size given the other follows the
// rectangle's proportions; with none the picture is 800 pixels wide. The format is the file's
// extension (.png) unless -format gives it.
// kelmartool::changes ?-command ?SCRIPT??: the count of changes of what the picture shows; SCRIPT
// runs in the idle pass after changes, once for all of them (the window's redraw); -command alone
// gives the script set.
#include "scene_commands.h"

#include <algorithm>
#include <cctype>
#include <cmath>
#include <cstdlib>
#include <exception>
#include <memory>
#include <string>

#include "file_io.h"
#include "property.h"
#include "scene.h"
#include "scene_raster.h"
#include "scene_svg.h"

namespace kelmartool {

namespace {

constexpr int kDefaultWidth = 800;
constexpr int kMaxPixels = 20000;  // a side of a picture
// A side of a PNG: its pixels are held three times over (the tool's buffer, Tk's photo, the PNG).
constexpr int kMaxPngPixels = 4096;

int Refused(Tcl_Interp* interp, const ToolState& state, Refusal kind, const std::string& text) {
    SetRefusal(state, kind);
    Tcl_SetObjResult(interp, Tcl_NewStringObj(text.c_str(), static_cast<int>(text.size())));
    return TCL_ERROR;
}

// The state with an open design, or an error left in the interpreter.
StatePtr OpenState(Tcl_Interp* interp) {
    StatePtr state = StateOf(interp);
    if (!state) {
        Tcl_SetObjResult(interp, Tcl_NewStringObj(kStateGone, -1));
        return nullptr;
    }
    if (state->CurrentDesign() == nullptr) {
        Refused(interp, *state, Refusal::NoProject, kNoProject);
        return nullptr;
    }
    return state;
}

bool ParseRect(Tcl_Interp* interp, const ToolState& state, Tcl_Obj* value, Viewport& rect) {
    int count = 0;
    Tcl_Obj** words = nullptr;
    double c[4];
    bool ok = Tcl_ListObjGetElements(nullptr, value, &count, &words) == TCL_OK && count == 4;
    for (int i = 0; ok && i < 4; ++i)
        ok = Tcl_GetDoubleFromObj(nullptr, words[i], &c[i]) == TCL_OK && std::isfinite(c[i]) &&
             std::fabs(c[i]) <= 2.0 * kMaxSide;
    ok = ok && c[2] > c[0] && c[3] > c[1];
    if (!ok) {
        Refused(interp, state, Refusal::Value,
                std::string("bad rectangle \"") + Tcl_GetString(value) +
                    "\": give four numbers x0 y0 x1 y1 with x0 < x1 and y0 < y1, within " +
                    std::to_string(2 * kMaxSide) + " of the origin");
        return false;
    }
    rect = Viewport{c[0], c[1], c[2] - c[0], c[3] - c[1]};
    return true;
}

// The index of `value` in the null-ended `words` (an option, a choice); false with Tcl's message
// and the VALUE code when it is none of them.
bool Choose(Tcl_Interp* interp, const ToolState& state, Tcl_Obj* value, const char* const* words, const char* what,
            int& index) {
    if (Tcl_GetIndexFromObj(interp, value, words, what, 0, &index) == TCL_OK) return true;
    SetRefusal(state, Refusal::Value);
    return false;
}

// The value of -nets: all, marked or none.
bool ParseNets(Tcl_Interp* interp, const ToolState& state, Tcl_Obj* value, NetLines& nets) {
    static const char* const kWords[] = {"all", "marked", "none", nullptr};
    int index = 0;
    if (!Choose(interp, state, value, kWords, "net choice", index)) return false;
    nets = index == 0 ? NetLines::All : index == 1 ? NetLines::Marked : NetLines::None;
    return true;
}

Tcl_Obj* ItemValue(const SceneItem& item) {
    Tcl_Obj* coords = Tcl_NewListObj(0, nullptr);
    for (const double c : item.coords) Tcl_ListObjAppendElement(nullptr, coords, Tcl_NewDoubleObj(c));
    return NewList({NewText("kind"), NewText(SceneKindWord(item.kind)), NewText("name"), NewText(item.name),
                    NewText("coords"), coords, NewText("fill"), NewText(item.fill), NewText("outline"),
                    NewText(item.outline), NewText("label"), NewText(item.label), NewText("layer"),
                    Tcl_NewIntObj(item.layer)});
}

int SceneCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc % 2 != 1 || objc > 5) {
        Tcl_WrongNumArgs(interp, 1, objv, "?-rect {x0 y0 x1 y1}? ?-nets all|marked|none?");
        return TCL_ERROR;
    }
    try {
        const StatePtr state = OpenState(interp);
        if (!state) return TCL_ERROR;
        Viewport rect = ShownRect(*state);
        NetLines nets = NetLines::Marked;
        for (int i = 1; i < objc; i += 2) {
            static const char* const kOptions[] = {"-rect", "-nets", nullptr};
            int index = 0;
            if (!Choose(interp, *state, objv[i], kOptions, "option", index)) return TCL_ERROR;
            if (index == 0 ? !ParseRect(interp, *state, objv[i + 1], rect) : !ParseNets(interp, *state, objv[i + 1], nets))
                return TCL_ERROR;
        }
        const Scene scene = BuildScene(*state, rect, nets);
        Tcl_Obj* list = Tcl_NewListObj(0, nullptr);
        for (const SceneItem& item : scene.items) Tcl_ListObjAppendElement(nullptr, list, ItemValue(item));
        Tcl_SetObjResult(interp, list);
        return TCL_OK;
    } catch (const std::exception& e) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("cannot build the scene: %s", e.what()));
        return TCL_ERROR;
    }
}

int ShownCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc != 1) {
        Tcl_WrongNumArgs(interp, 1, objv, "");
        return TCL_ERROR;
    }
    const StatePtr state = OpenState(interp);
    if (!state) return TCL_ERROR;
    const Viewport rect = ShownRect(*state);
    Tcl_SetObjResult(interp, NewList({Tcl_NewDoubleObj(rect.x), Tcl_NewDoubleObj(rect.y),
                                      Tcl_NewDoubleObj(rect.x + rect.width), Tcl_NewDoubleObj(rect.y + rect.height)}));
    return TCL_OK;
}

// Loads Tk for a PNG, through the window's helper; false with the refusal left when it cannot.
bool LoadTk(Tcl_Interp* interp, const ToolState& state) {
    if (Tcl_EvalEx(interp, "::kelmartool::window::pictureTk", -1, TCL_EVAL_GLOBAL) == TCL_OK) return true;
    Refused(interp, state, Refusal::NoDisplay,
            std::string("a PNG needs Tk, which cannot be loaded here: ") + Tcl_GetStringResult(interp));
    return false;
}

// A colour as Tk knows it, through `winfo rgb`, as the window's canvas draws it.
bool TkColour(Tcl_Interp* interp, const std::string& name, Rgb& rgb) {
    if (name.size() == 7 && name[0] == '#' &&
        std::all_of(name.begin() + 1, name.end(), [](char c) { return std::isxdigit(static_cast<unsigned char>(c)); })) {
        const unsigned long value = std::strtoul(name.c_str() + 1, nullptr, 16);
        rgb = Rgb{static_cast<unsigned char>(value >> 16), static_cast<unsigned char>(value >> 8),
                  static_cast<unsigned char>(value)};
        return true;
    }
    TclValue command(NewList({NewText("winfo"), NewText("rgb"), NewText("."), NewText(name)}));
    const bool found = Tcl_EvalObjEx(interp, command.get(), TCL_EVAL_GLOBAL) == TCL_OK;
    int count = 0;
    Tcl_Obj** words = nullptr;
    int channel[3] = {0, 0, 0};
    bool ok = found && Tcl_ListObjGetElements(nullptr, Tcl_GetObjResult(interp), &count, &words) == TCL_OK && count == 3;
    for (int i = 0; ok && i < 3; ++i) ok = Tcl_GetIntFromObj(nullptr, words[i], &channel[i]) == TCL_OK;
    Tcl_ResetResult(interp);
    rgb = Rgb{static_cast<unsigned char>(channel[0] >> 8), static_cast<unsigned char>(channel[1] >> 8),
              static_cast<unsigned char>(channel[2] >> 8)};
    return ok;
}

// The PNG data of the scene: drawn here, made a PNG by a Tk photo image. False with the error left.
bool ScenePng(Tcl_Interp* interp, const ToolState& state, const Scene& scene, int width, int height, std::string& png) {
    if (!LoadTk(interp, state)) return false;
    // Without a font the picture is still made, with no labels.
    std::string why;
    const std::unique_ptr<LabelFont> font = LabelFont::Open(kLabelFamily, kLabelPixels, why);
    const std::string ppm = ScenePpm(
        scene, width, height, [interp](const std::string& name, Rgb& rgb) { return TkColour(interp, name, rgb); }, font.get());
    TclValue command(NewList({NewText("::kelmartool::window::png"),
                              Tcl_NewByteArrayObj(reinterpret_cast<const unsigned char*>(ppm.data()),
                                                  static_cast<int>(ppm.size()))}));
    if (Tcl_EvalObjEx(interp, command.get(), TCL_EVAL_GLOBAL) != TCL_OK) {
        Refused(interp, state, Refusal::NoDisplay, std::string("cannot make the PNG: ") + Tcl_GetStringResult(interp));
        return false;
    }
    int length = 0;
    const unsigned char* bytes = Tcl_GetByteArrayFromObj(Tcl_GetObjResult(interp), &length);
    png.assign(reinterpret_cast<const char*>(bytes), static_cast<std::size_t>(length));
    Tcl_ResetResult(interp);
    return true;
}

bool EndsWithPng(const std::string& file) {
    if (file.size() < 4) return false;
    std::string tail = file.substr(file.size() - 4);
    for (char& c : tail) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return tail == ".png";
}

int SnapshotCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc < 2 || objc % 2 != 0) {
        Tcl_WrongNumArgs(interp, 1, objv, "file ?-width px? ?-height px? ?-nets all|marked|none? ?-format svg|png?");
        return TCL_ERROR;
    }
    try {
        const StatePtr state = OpenState(interp);
        if (!state) return TCL_ERROR;
        const std::string file = Tcl_GetString(objv[1]);
        int size[2] = {0, 0};  // width, height; 0 while not given
        NetLines nets = NetLines::Marked;
        bool png = EndsWithPng(file);
        for (int i = 2; i < objc; i += 2) {
            static const char* const kOptions[] = {"-width", "-height", "-nets", "-format", nullptr};
            static const char* const kFormats[] = {"svg", "png", nullptr};
            int index = 0;
            if (!Choose(interp, *state, objv[i], kOptions, "option", index)) return TCL_ERROR;
            if (index == 2) {
                if (!ParseNets(interp, *state, objv[i + 1], nets)) return TCL_ERROR;
                continue;
            }
            if (index == 3) {
                int format = 0;
                if (!Choose(interp, *state, objv[i + 1], kFormats, "format", format)) return TCL_ERROR;
                png = format == 1;
                continue;
            }
            int px = 0;
            if (Tcl_GetIntFromObj(nullptr, objv[i + 1], &px) != TCL_OK || px < 1 || px > kMaxPixels)
                return Refused(interp, *state, Refusal::Value,
                               std::string("bad ") + (index == 0 ? "width" : "height") + " \"" +
                                   Tcl_GetString(objv[i + 1]) + "\": give a whole number of pixels from 1 to " +
                                   std::to_string(kMaxPixels));
            size[index] = px;
        }
        const Viewport rect = ShownRect(*state);
        // The view interface keeps at least one site a side; a rectangle with no area has no scale.
        if (!(rect.width > 0 && rect.height > 0 && std::isfinite(rect.width) && std::isfinite(rect.height)))
            return Refused(interp, *state, Refusal::State, "the view shows no area to draw");
        auto follow = [](double px) { return static_cast<int>(std::clamp(std::lround(px), 1L, long(kMaxPixels))); };
        if (size[0] == 0 && size[1] == 0) size[0] = kDefaultWidth;
        if (size[0] == 0) size[0] = follow(size[1] * rect.width / rect.height);
        if (size[1] == 0) size[1] = follow(size[0] * rect.height / rect.width);
        if (png && std::max(size[0], size[1]) > kMaxPngPixels)
            return Refused(interp, *state, Refusal::Limit,
                           "a PNG of " + std::to_string(size[0]) + " x " + std::to_string(size[1]) +
                               " pixels is too large: a PNG has at most " + std::to_string(kMaxPngPixels) +
                               " pixels a side");

        if (file.empty()) return Refused(interp, *state, Refusal::Value, "the snapshot needs a file name");
        const Scene scene = BuildScene(*state, rect, nets);
        std::string data;
        if (!png)
            data = SceneSvg(scene, size[0], size[1]);
        else if (!ScenePng(interp, *state, scene, size[0], size[1], data))
            return TCL_ERROR;
        if (std::string why; !WriteTextFile(file, data, why)) {
            SetRefusal(*state, Refusal::File, {file});
            const std::string text = "cannot write the snapshot to '" + file + "': " + why;
            Tcl_SetObjResult(interp, Tcl_NewStringObj(text.c_str(), static_cast<int>(text.size())));
            return TCL_ERROR;
        }
        Tcl_SetObjResult(interp, objv[1]);
        return TCL_OK;
    } catch (const std::exception& e) {
        Tcl_SetObjResult(interp, Tcl_ObjPrintf("cannot write the snapshot: %s", e.what()));
        return TCL_ERROR;
    }
}

int ChangesCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc > 3) {
        Tcl_WrongNumArgs(interp, 1, objv, "?-command ?script??");
        return TCL_ERROR;
    }
    const StatePtr state = StateOf(interp);
    if (!state) {
        Tcl_SetObjResult(interp, Tcl_NewStringObj(kStateGone, -1));
        return TCL_ERROR;
    }
    if (objc >= 2) {
        static const char* const kOptions[] = {"-command", nullptr};
        int index = 0;
        if (!Choose(interp, *state, objv[1], kOptions, "option", index)) return TCL_ERROR;
    }
    if (objc == 2) {  // the script set, or "" when none
        Tcl_SetObjResult(interp, state->onChange ? state->onChange.get() : Tcl_NewObj());
        return TCL_OK;
    }
    if (objc == 3) {
        int length = 0;
        Tcl_GetStringFromObj(objv[2], &length);
        state->onChange = length == 0 ? TclValue() : TclValue(objv[2]);
    }
    Tcl_SetObjResult(interp, Tcl_NewWideIntObj(static_cast<Tcl_WideInt>(state->changes)));
    return TCL_OK;
}

}  // namespace

void CreateSceneCommands(Tcl_Interp* interp) {
    Tcl_CreateObjCommand(interp, "::kelmartool::scene", SceneCommand, nullptr, nullptr);
    Tcl_CreateObjCommand(interp, "::kelmartool::shown", ShownCommand, nullptr, nullptr);
    Tcl_CreateObjCommand(interp, "::kelmartool::snapshot", SnapshotCommand, nullptr, nullptr);
    Tcl_CreateObjCommand(interp, "::kelmartool::changes", ChangesCommand, nullptr, nullptr);
}

}  // namespace kelmartool
