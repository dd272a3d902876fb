// The pixel renderer of the scene: rectangles, lines and labels into an RGB buffer, with the SVG
// renderer's mapping (the rectangle stretched over the picture, y down), strokes and label places.
#include "scene_raster.h"

#include <algorithm>
#include <cmath>
#include <map>
#include <optional>
#include <vector>

namespace kelmartool {

namespace {

class Raster {
public:
    Raster(const Scene& scene, int width, int height, const ColourOf& colour, LabelFont* font)
        : m_rect(scene.rect), m_width(width), m_height(height), m_sx(width / scene.rect.width),
          m_sy(height / scene.rect.height), m_colourOf(colour), m_font(font),
          m_pixels(std::size_t(width) * std::size_t(height) * 3) {
        Fill(0, 0, width, height, Rgb{0xf0, 0xf0, 0xf0});
    }

    void Item(const SceneItem& item) {
        const std::vector<double>& c = item.coords;
        Rgb stroke{}, fill{};
        const bool stroked = Colour(item.outline, stroke), filled = Colour(item.fill, fill);
        switch (item.kind) {
            case SceneKind::Grid:
                if (!stroked || m_sx < 4 || m_sy < 4) return;  // as the window, which rules no finer grid
                for (double x = c[0]; x <= c[2]; x += 1) Line(X(x), Y(c[1]), X(x), Y(c[3]), 1, 0, stroke);
                for (double y = c[1]; y <= c[3]; y += 1) Line(X(c[0]), Y(y), X(c[2]), Y(y), 1, 0, stroke);
                return;
            case SceneKind::Net:
                if (!stroked) return;
                for (std::size_t i = 2; i + 1 < c.size(); i += 2)
                    Line(X(c[0]), Y(c[1]), X(c[i]), Y(c[i + 1]), 1.5, 4, stroke);
                return;
            case SceneKind::Path:
                if (!stroked) return;
                for (std::size_t i = 2; i + 1 < c.size(); i += 2)
                    Line(X(c[i - 2]), Y(c[i - 1]), X(c[i]), Y(c[i + 1]), 3, 0, stroke);
                return;
            default: break;
        }
        const double x0 = X(c[0]), x1 = X(c[2]), y0 = Y(c[3]), y1 = Y(c[1]);
        if (filled) Fill(x0, y0, x1, y1, fill);
        if (stroked) {
            const double width = item.outline == kSelectionColor ? 3 : 1;
            Line(x0, y0, x1, y0, width, 0, stroke);
            Line(x1, y0, x1, y1, width, 0, stroke);
            Line(x1, y1, x0, y1, width, 0, stroke);
            Line(x0, y1, x0, y0, width, 0, stroke);
            if (item.kind == SceneKind::Prohibited) {
                Line(x0, y0, x1, y1, 1, 0, stroke);
                Line(x0, y1, x1, y0, 1, 0, stroke);
            }
        }
        if (m_font == nullptr) return;
        Rgb ink, backing;
        if (const std::optional<LabelSpot> spot = PlaceLabel(item, x0, y0, x1, y1); spot && Colour(spot->colour, ink)) {
            const bool backed = spot->backing && Colour(*spot->backing, backing);
            m_labels.push_back({&item, spot->x, spot->baseline, ink, backed, backing});
        }
    }

    // The labels, after every shape and line, so that none covers a name.
    void Labels() {
        for (const Label& label : m_labels) {
            const std::u32string text = LabelText(label.item->label);
            if (label.backed) {  // the letters' box and a pixel around it, from the descent to the caps
                const double half = double(m_font->Advance(text)) / 2 + 1;
                Fill(label.x - half, label.baseline - kLabelPixels * 0.8 - 1, label.x + half,
                     label.baseline + kLabelPixels * 0.25 + 1, label.backing);
            }
            Text(text, label.x, label.baseline, label.ink);
        }
    }

    std::string Ppm() const {
        std::string out = "P6\n" + std::to_string(m_width) + " " + std::to_string(m_height) + "\n255\n";
        out.append(reinterpret_cast<const char*>(m_pixels.data()), m_pixels.size());
        return out;
    }

private:
    double X(double x) const { return (x - m_rect.x) * m_sx; }
    double Y(double y) const { return (m_rect.y + m_rect.height - y) * m_sy; }

    bool Colour(const std::string& name, Rgb& rgb) {
        if (name.empty()) return false;
        auto it = m_known.find(name);
        if (it == m_known.end()) {
            Rgb found;
            const bool known = m_colourOf(name, found);
            it = m_known.emplace(name, std::pair{known, found}).first;
        }
        rgb = it->second.second;
        return it->second.first;
    }

    void Put(long x, long y, const Rgb& c) {
        if (x < 0 || y < 0 || x >= m_width || y >= m_height) return;
        unsigned char* p = &m_pixels[(std::size_t(y) * std::size_t(m_width) + std::size_t(x)) * 3];
        p[0] = c.r, p[1] = c.g, p[2] = c.b;
    }

    // The pixels whose centres lie in the box, clipped to the picture.
    void Fill(double x0, double y0, double x1, double y1, const Rgb& c) {
        const long ax = std::max(0L, std::lround(std::min(x0, x1))), bx = std::min(long(m_width), std::lround(std::max(x0, x1)));
        const long ay = std::max(0L, std::lround(std::min(y0, y1))), by = std::min(long(m_height), std::lround(std::max(y0, y1)));
        for (long y = ay; y < by; ++y)
            for (long x = ax; x < bx; ++x) Put(x, y, c);
    }

    // A line `width` pixels wide, dashed `dash` on and `dash` off when dash > 0. The line is clipped
    // to the picture first, so that a line reaching far beyond it costs no more than one across it.
    void Line(double x0, double y0, double x1, double y1, double width, double dash, const Rgb& c) {
        const double margin = width + 1;
        double t0 = 0, t1 = 1;
        const double dx = x1 - x0, dy = y1 - y0;
        auto clip = [&](double p, double q) {  // Liang-Barsky: keeps the part where p * t <= q
            if (p == 0) return q >= 0;
            const double t = q / p;
            if (p < 0) {
                if (t > t1) return false;
                t0 = std::max(t0, t);
            } else {
                if (t < t0) return false;
                t1 = std::min(t1, t);
            }
            return true;
        };
        if (!clip(-dx, x0 + margin) || !clip(dx, m_width + margin - x0) || !clip(-dy, y0 + margin) ||
            !clip(dy, m_height + margin - y0))
            return;
        const double length = std::hypot(dx, dy);
        const long steps = std::max(1L, std::lround(length * (t1 - t0)));
        const long half = std::max(0L, std::lround(width / 2 - 0.5)), reach = std::max(0L, std::lround(width) - 1 - half);
        for (long i = 0; i <= steps; ++i) {
            const double t = t0 + (t1 - t0) * double(i) / double(steps);
            if (dash > 0 && std::fmod(t * length, 2 * dash) >= dash) continue;
            // The pixel a point falls in. Rounding `v - 0.5` instead would flip between two pixels
            // at whole coordinates (a grid line's) as the steps' rounding errors add up, and leave
            // gaps in the line.
            const long px = std::lround(std::floor(x0 + dx * t + 1e-9)), py = std::lround(std::floor(y0 + dy * t + 1e-9));
            for (long oy = -half; oy <= reach; ++oy)
                for (long ox = -half; ox <= reach; ++ox) Put(px + ox, py + oy, c);
        }
    }

    // The text centred on x, on the baseline y, its glyphs' coverage blending `ink` into the pixels
    // they cover inside the picture. A label far outside costs only the measure of its box.
    void Text(const std::u32string& text, double x, double y, const Rgb& ink) {
        const long width = m_font->Advance(text);
        const double left = x - double(width) / 2, reach = 4 * kLabelPixels;
        if (left + double(width) + reach < 0 || left - reach > m_width || y + reach < 0 || y - reach > m_height) return;
        long pen = std::lround(left);
        const long baseline = std::lround(y);
        for (const char32_t c : text) {
            const LabelFont::Glyph& glyph = m_font->GlyphOf(c);
            const long gx = pen + glyph.left, gy = baseline - glyph.top;
            for (long row = std::max(0L, -gy); row < glyph.rows && gy + row < m_height; ++row)
                for (long col = std::max(0L, -gx); col < glyph.width && gx + col < m_width; ++col)
                    Blend(gx + col, gy + row, ink, glyph.coverage[std::size_t(row) * std::size_t(glyph.width) + std::size_t(col)]);
            pen += glyph.advance;
        }
    }

    void Blend(long x, long y, const Rgb& c, unsigned coverage) {
        if (coverage == 0) return;
        unsigned char* p = &m_pixels[(std::size_t(y) * std::size_t(m_width) + std::size_t(x)) * 3];
        auto mix = [coverage](unsigned char under, unsigned char over) {
            return static_cast<unsigned char>((over * coverage + under * (255 - coverage) + 127) / 255);
        };
        p[0] = mix(p[0], c.r), p[1] = mix(p[1], c.g), p[2] = mix(p[2], c.b);
    }

    struct Label {
        const SceneItem* item;
        double x, baseline;
        Rgb ink;
        bool backed;
        Rgb backing;
    };

    Viewport m_rect;
    int m_width, m_height;
    double m_sx, m_sy;
    const ColourOf& m_colourOf;
    LabelFont* m_font;
    std::map<std::string, std::pair<bool, Rgb>> m_known;
    std::vector<unsigned char> m_pixels;
    std::vector<Label> m_labels;
};

}  // namespace

std::string ScenePpm(const Scene& scene, int width, int height, const ColourOf& colour, LabelFont* font) {
    Raster raster(scene, width, height, colour, font);
    for (const SceneItem& item : scene.items) raster.Item(item);
    raster.Labels();
    return raster.Ppm();
}

}  // namespace kelmartool
