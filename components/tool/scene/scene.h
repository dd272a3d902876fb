// The scene of the graphical view: what a picture of the tool state shows inside one rectangle of
// the device, as a list of drawable items. The Tk window and the SVG file both draw this list, so
// that the layout is decided here once and a renderer only maps coordinates and colours.
//
// Coordinates are in site units with y up, as the view interface holds them: site X<c>Y<r> covers
// [c, c+1) x [r, r+1). A renderer flips y when its pixels grow downwards.
#pragma once

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "design.h"

namespace kelmartool {

enum class SceneKind {
    Device,      // the device outline
    Grid,        // the site grid: coords is the rectangle to rule at every whole site
    Bank,        // a bank's sites
    Prohibited,  // one prohibited site
    Block,       // a floorplan block's region
    Site,        // a highlighted or selected site
    Cell,        // one placed cell
    Density,     // one bin of the density picture: label is its cell count
    Port,        // a port on its site
    Net,         // a fly-line star: from the first point to each of the others
    Path,        // the worst path of the last timing run, a polyline through its points
};

// The word of a kind in a scene list ("cell", "density", ...).
const char* SceneKindWord(SceneKind kind) noexcept;

// Drawing order: a renderer draws lower layers first.
enum SceneLayer : int {
    kLayerDevice = 0,
    kLayerBank = 1,
    kLayerProhibited = 2,
    kLayerCell = 3,
    kLayerBlock = 4,
    kLayerPort = 5,
    kLayerNet = 6,
    kLayerPath = 7,
};

struct SceneItem {
    SceneKind kind = SceneKind::Cell;
    std::string name;            // the object's name; a density bin or a path has a made one
    std::vector<double> coords;  // a rectangle x0 y0 x1 y1, or the points x y x y ... of a line
    std::string fill;            // empty: not filled
    std::string outline;         // empty: no outline
    std::string label;           // text to show when the zoom leaves room for it
    int layer = kLayerDevice;
};

// Which nets a picture draws as fly-lines, from the driver to each load.
enum class NetLines {
    None,    // no net
    Marked,  // the highlighted or selected nets
    All,     // every net that meets the rectangle, within kFlyLineLimit
};

struct Scene {
    Viewport rect;                  // what the picture shows
    std::size_t cellsInView = 0;    // placed cells whose site meets the rectangle
    bool density = false;           // cells drawn as a density grid instead of one by one
    bool flyLinesLeftOut = false;   // NetLines::All met more lines than kFlyLineLimit: marked nets only
    std::vector<SceneItem> items;   // in layer order
};

// Above this many cells in the rectangle, cells become a density grid: a picture of more cells than
// a screen has pixels for them shows nothing one could read, and costs a window its speed.
inline constexpr std::size_t kDetailCellLimit = 20000;
// The density grid has at most this many bins a side.
inline constexpr int kDensityBins = 64;
// Above this many fly-lines of nets neither highlighted nor selected in the rectangle, none of them is
// drawn: a star of lines over every net of a large design covers the picture and tells nothing.
inline constexpr std::size_t kFlyLineLimit = 20000;

// Colours the scene gives, so that tests and renderers name them once.
inline constexpr const char* kSelectionColor = "#ff00ff";
inline constexpr const char* kPathColor = "#e00000";
inline constexpr const char* kFlyLineColor = "#7080a8";  // a net neither highlighted nor selected

// Labels, as both picture files draw them: in a sans-serif face this many pixels to the em, the
// size the window's 8-point label font has at Tk's scaling, dark grey, a block's in its outline's blue.
inline constexpr double kLabelPixels = 11;
inline constexpr const char* kLabelColor = "#202020";
inline constexpr const char* kBlockLabelColor = "#2060c0";

// Where a picture writes the label of a rectangle item drawn over the pixels px0..px1 by py0..py1
// (y down, py0 the top): the middle of the text and its baseline, and its colour.
struct LabelSpot {
    double x = 0, baseline = 0;
    const char* colour = kLabelColor;
    // The colour laid behind the letters, the item's own fill, so that a fly-line or the path
    // crossing the item leaves its name readable; null for a label outside its item's fill (a
    // block's, a bank's) or an item with none.
    const std::string* backing = nullptr;
};
// Nothing for an item with no label, the device, or one that leaves no room for its label (its
// width judged from the label's length, the same in every renderer).
std::optional<LabelSpot> PlaceLabel(const SceneItem& item, double px0, double py0, double px1, double py1);

// The scene of the current design of `state` inside `rect` (which must have a positive width and
// height), with the fly-lines of `nets`. The design must be open.
Scene BuildScene(const ToolState& state, const Viewport& rect, NetLines nets = NetLines::Marked);

// The rectangle the view interface shows now: the last zoom or pan, or the whole device.
Viewport ShownRect(const ToolState& state);

// The fill of a cell of a type that is neither highlighted nor selected.
const char* CellTypeColor(const std::string& type) noexcept;

}  // namespace kelmartool
