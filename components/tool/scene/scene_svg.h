// The scene as an SVG picture: needs neither Tk nor a display.
#pragma once

#include <string>

#include "scene.h"

namespace kelmartool {

// The SVG text of `scene` in a picture of `width` by `height` pixels whose extent is the scene's
// rectangle. Every item is an element with the item's name as its `id` and its `<title>` and its
// kind as its `class`; labels are written where the item leaves room for them.
std::string SceneSvg(const Scene& scene, int width, int height);

}  // namespace kelmartool
