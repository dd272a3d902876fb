// The face a PNG snapshot writes its labels in: found by fontconfig, rendered by FreeType into
// anti-aliased coverage masks that the pixel renderer blends into its picture.
#pragma once

#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace kelmartool {

// The family the window's canvas writes its labels in (show.tcl, putLabel); fontconfig gives the
// same face for it as it gives Tk's Xft, or its default sans-serif face where it knows no other.
inline constexpr const char* kLabelFamily = "Helvetica";

class LabelFont {
public:
    // One character's picture: `coverage` holds rows x width values from 0 (none) to 255 (all),
    // placed `left` pixels right of the pen and `top` pixels above the baseline.
    struct Glyph {
        int left = 0, top = 0, width = 0, rows = 0;
        long advance = 0;  // pixels the pen moves on
        std::vector<unsigned char> coverage;
    };

    // The face fontconfig matches to `family`, at `pixels` to the em; null, with why, when none is
    // found or FreeType cannot load the one found at that size.
    static std::unique_ptr<LabelFont> Open(const char* family, double pixels, std::string& why);
    ~LabelFont();
    LabelFont(const LabelFont&) = delete;
    LabelFont& operator=(const LabelFont&) = delete;

    // The glyph of a character, rendered on first use and kept: a picture repeats its few letters.
    const Glyph& GlyphOf(char32_t character);
    // The pixels the pen moves over the text.
    long Advance(std::u32string_view text);

private:
    struct Face;
    explicit LabelFont(std::unique_ptr<Face> face);
    std::unique_ptr<Face> m_face;
};

// The characters of UTF-8 text; a byte that begins no valid sequence gives U+FFFD, and a control
// character the '?' the SVG writes for it.
std::u32string LabelText(std::string_view utf8);

}  // namespace kelmartool
