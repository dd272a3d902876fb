// The scene as pixels: a binary PPM (P6) picture that a Tk photo image reads and writes as PNG.
#pragma once

#include <functional>
#include <string>

#include "scene.h"
#include "scene_font.h"

namespace kelmartool {

struct Rgb {
    unsigned char r = 0, g = 0, b = 0;
};

// Gives the colour of a name the scene uses (a colour name or #rrggbb); false for one it does not know.
using ColourOf = std::function<bool(const std::string& name, Rgb& colour)>;

// The PPM data of `scene` in a picture of `width` by `height` pixels, drawn as the SVG renderer draws
// it (the same extent, colours, outlines, dashes and labels). A colour `colour` does not know is left
// out: its fill or its outline is not drawn. Labels are written in `font`; with none, left out.
std::string ScenePpm(const Scene& scene, int width, int height, const ColourOf& colour, LabelFont* font);

}  // namespace kelmartool
