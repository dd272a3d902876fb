// kelmartool::scene ?-rect {x0 y0 x1 y1}?: the scene as a list of dicts (kind, name, coords,
// fill, outline, label, layer), of the view's rectangle unless -rect gives one.
// kelmartool::shown: the view's rectangle as {x0 y0 x1 y1} in sites, the one scene and snapshot draw.
// kelmartool::snapshot FILE ?-width PX? ?-height PX?: the view's rectangle written as SVG. With one
// size given the other follows the rectangle's proportions; with none the picture is 800 pixels wide.
#include "scene_commands.h"

#include <algorithm>
#include <cmath>
#include <exception>
#include <string>

#include "file_io.h"
#include "property.h"
#include "scene.h"
#include "scene_svg.h"

namespace kelmartool {

namespace {

constexpr int kDefaultWidth = 800;
constexpr int kMaxPixels = 20000;  // a side of a picture

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

Tcl_Obj* ItemValue(const SceneItem& item) {
    Tcl_Obj* coords = Tcl_NewListObj(0, nullptr);
    for (const double c : item.coords) Tcl_ListObjAppendElement(nullptr, coords, Tcl_NewDoubleObj(c));
    return NewList({NewText("kind"), NewText(SceneKindWord(item.kind)), NewText("name"), NewText(item.name),
                    NewText("coords"), coords, NewText("fill"), NewText(item.fill), NewText("outline"),
                    NewText(item.outline), NewText("label"), NewText(item.label), NewText("layer"),
                    Tcl_NewIntObj(item.layer)});
}

int SceneCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc != 1 && objc != 3) {
        Tcl_WrongNumArgs(interp, 1, objv, "?-rect {x0 y0 x1 y1}?");
        return TCL_ERROR;
    }
    try {
        const StatePtr state = OpenState(interp);
        if (!state) return TCL_ERROR;
        Viewport rect = ShownRect(*state);
        if (objc == 3) {
            static const char* const kOptions[] = {"-rect", nullptr};
            int index = 0;
            if (Tcl_GetIndexFromObj(interp, objv[1], kOptions, "option", 0, &index) != TCL_OK) {
                SetRefusal(*state, Refusal::Value);
                return TCL_ERROR;
            }
            if (!ParseRect(interp, *state, objv[2], rect)) return TCL_ERROR;
        }
        const Scene scene = BuildScene(*state, rect);
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

int SnapshotCommand(ClientData, Tcl_Interp* interp, int objc, Tcl_Obj* const objv[]) {
    if (objc < 2 || objc % 2 != 0) {
        Tcl_WrongNumArgs(interp, 1, objv, "file ?-width px? ?-height px?");
        return TCL_ERROR;
    }
    try {
        const StatePtr state = OpenState(interp);
        if (!state) return TCL_ERROR;
        int size[2] = {0, 0};  // width, height; 0 while not given
        for (int i = 2; i < objc; i += 2) {
            static const char* const kOptions[] = {"-width", "-height", nullptr};
            int index = 0;
            if (Tcl_GetIndexFromObj(interp, objv[i], kOptions, "option", 0, &index) != TCL_OK) {
                SetRefusal(*state, Refusal::Value);
                return TCL_ERROR;
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

        const std::string file = Tcl_GetString(objv[1]);
        if (file.empty()) return Refused(interp, *state, Refusal::Value, "the snapshot needs a file name");
        const std::string svg = SceneSvg(BuildScene(*state, rect), size[0], size[1]);
        if (std::string why; !WriteTextFile(file, svg, why)) {
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

}  // namespace

void CreateSceneCommands(Tcl_Interp* interp) {
    Tcl_CreateObjCommand(interp, "::kelmartool::scene", SceneCommand, nullptr, nullptr);
    Tcl_CreateObjCommand(interp, "::kelmartool::shown", ShownCommand, nullptr, nullptr);
    Tcl_CreateObjCommand(interp, "::kelmartool::snapshot", SnapshotCommand, nullptr, nullptr);
}

}  // namespace kelmartool
