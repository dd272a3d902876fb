// The SVG renderer of the scene: maps site coordinates (y up) to pixels (y down).
#include "scene_svg.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <string_view>

namespace kelmartool {

namespace {

// Attribute and text content: the five XML specials escaped, the controls XML 1.0 forbids replaced.
std::string Escape(std::string_view text) {
    std::string out;
    out.reserve(text.size());
    for (const char c : text) {
        switch (c) {
            case '&': out += "&amp;"; break;
            case '<': out += "&lt;"; break;
            case '>': out += "&gt;"; break;
            case '"': out += "&quot;"; break;
            case '\'': out += "&apos;"; break;
            default:
                if (static_cast<unsigned char>(c) < 0x20 && c != '\t' && c != '\n' && c != '\r')
                    out += '?';
                else
                    out += c;
        }
    }
    return out;
}

std::string Number(double value) {
    char text[32];
    std::snprintf(text, sizeof text, "%.2f", value);
    std::string out = text;
    while (out.back() == '0') out.pop_back();
    if (out.back() == '.') out.pop_back();
    return out == "-0" ? "0" : out;
}

class Painter {
public:
    Painter(const Scene& scene, int width, int height)
        : m_rect(scene.rect), m_sx(width / scene.rect.width), m_sy(height / scene.rect.height) {}

    std::string X(double x) const { return Number((x - m_rect.x) * m_sx); }
    std::string Y(double y) const { return Number((m_rect.y + m_rect.height - y) * m_sy); }

    // Writes the item's element to `out` and its label to `labels`, which follow every element, so
    // that no line or later shape covers a name.
    void Item(const SceneItem& item, std::string& out, std::string& labels) const {
        const std::string head = "id=\"" + Escape(item.name) + "\" class=\"" + SceneKindWord(item.kind) + "\"";
        const std::string title = "<title>" + Escape(item.name) + "</title>";
        const std::string stroke = item.outline.empty() ? "none" : Escape(item.outline);
        const std::vector<double>& c = item.coords;
        switch (item.kind) {
            case SceneKind::Grid: {
                std::string d;
                for (double x = c[0]; x <= c[2]; x += 1) d += "M" + X(x) + " " + Y(c[1]) + "V" + Y(c[3]);
                for (double y = c[1]; y <= c[3]; y += 1) d += "M" + X(c[0]) + " " + Y(y) + "H" + X(c[2]);
                out += "<path " + head + " d=\"" + d + "\" fill=\"none\" stroke=\"" + stroke +
                       "\" stroke-width=\"0.5\">" + title + "</path>\n";
                return;
            }
            case SceneKind::Net: {
                std::string d;
                for (std::size_t i = 2; i + 1 < c.size(); i += 2)
                    d += "M" + X(c[0]) + " " + Y(c[1]) + "L" + X(c[i]) + " " + Y(c[i + 1]);
                out += "<path " + head + " d=\"" + d + "\" fill=\"none\" stroke=\"" + stroke +
                       "\" stroke-width=\"1.5\" stroke-dasharray=\"4 3\">" + title + "</path>\n";
                return;
            }
            case SceneKind::Path: {
                std::string points;
                for (std::size_t i = 0; i + 1 < c.size(); i += 2)
                    points += (i ? " " : "") + X(c[i]) + "," + Y(c[i + 1]);
                out += "<polyline " + head + " points=\"" + points + "\" fill=\"none\" stroke=\"" + stroke +
                       "\" stroke-width=\"3\" stroke-linejoin=\"round\"><title>" + Escape(item.name) + ": " +
                       Escape(item.label) + "</title></polyline>\n";
                return;
            }
            default: break;
        }
        const double px0 = (c[0] - m_rect.x) * m_sx, px1 = (c[2] - m_rect.x) * m_sx;
        const double py0 = (m_rect.y + m_rect.height - c[3]) * m_sy, py1 = (m_rect.y + m_rect.height - c[1]) * m_sy;
        const bool selected = item.outline == kSelectionColor;
        out += "<rect " + head + " x=\"" + Number(px0) + "\" y=\"" + Number(py0) + "\" width=\"" + Number(px1 - px0) +
               "\" height=\"" + Number(py1 - py0) + "\" fill=\"" + (item.fill.empty() ? "none" : Escape(item.fill)) +
               "\" stroke=\"" + stroke + "\" stroke-width=\"" + (selected ? "3" : "1") + "\">" + title + "</rect>\n";
        if (item.kind == SceneKind::Prohibited)
            out += "<path d=\"M" + Number(px0) + " " + Number(py0) + "L" + Number(px1) + " " + Number(py1) + "M" +
                   Number(px0) + " " + Number(py1) + "L" + Number(px1) + " " + Number(py0) + "\" stroke=\"" + stroke +
                   "\"/>\n";
        const std::optional<LabelSpot> spot = PlaceLabel(item, px0, py0, px1, py1);
        if (!spot) return;
        labels += "<text x=\"" + Number(spot->x) + "\" y=\"" + Number(spot->baseline) + "\" font-size=\"" +
               Number(kLabelPixels) + "\" text-anchor=\"middle\" fill=\"" + spot->colour +
                  (spot->backing ? "\" stroke=\"" + Escape(*spot->backing) + "\" stroke-width=\"3\" paint-order=\"stroke" : "") +
                  "\">" + Escape(item.label) +
               "</text>\n";
    }

private:
    Viewport m_rect;
    double m_sx, m_sy;
};

}  // namespace

std::string SceneSvg(const Scene& scene, int width, int height) {
    const Painter painter(scene, width, height);
    const std::string w = std::to_string(width), h = std::to_string(height);
    std::string out = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<svg xmlns=\"http://www.w3.org/2000/svg\" width=\"" +
                      w + "\" height=\"" + h + "\" viewBox=\"0 0 " + w + " " + h +
                      "\" font-family=\"sans-serif\">\n<desc>x " + Number(scene.rect.x) + " y " +
                      Number(scene.rect.y) + " width " + Number(scene.rect.width) + " height " +
                      Number(scene.rect.height) + (scene.density ? " density" : "") +
                      (scene.flyLinesLeftOut ? " fly-lines-left-out" : "") + "</desc>\n<rect width=\"" + w +
                      "\" height=\"" + h + "\" fill=\"#f0f0f0\"/>\n";
    std::string labels;
    for (const SceneItem& item : scene.items) painter.Item(item, out, labels);
    out += labels;
    out += "</svg>\n";
    return out;
}

}  // namespace kelmartool
