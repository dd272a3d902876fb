// fontconfig finds the file of the label face, FreeType renders its glyphs. Every handle of either
// library is held by a unique_ptr whose deleter releases it, so that each way out of Open, and the
// end of a snapshot, gives back all of them.
#include "scene_font.h"

#include <fontconfig/fontconfig.h>
#include <ft2build.h>
#include FT_FREETYPE_H

#include <cmath>
#include <cstring>
#include <unordered_map>

namespace kelmartool {

namespace {

template <class T, void (*Release)(T*)>
struct Releaser {
    void operator()(T* handle) const noexcept { Release(handle); }
};
using ConfigPtr = std::unique_ptr<FcConfig, Releaser<FcConfig, FcConfigDestroy>>;
using PatternPtr = std::unique_ptr<FcPattern, Releaser<FcPattern, FcPatternDestroy>>;

void DoneLibrary(FT_LibraryRec_* library) { FT_Done_FreeType(library); }
void DoneFace(FT_FaceRec_* face) { FT_Done_Face(face); }
using LibraryPtr = std::unique_ptr<FT_LibraryRec_, Releaser<FT_LibraryRec_, DoneLibrary>>;
using FacePtr = std::unique_ptr<FT_FaceRec_, Releaser<FT_FaceRec_, DoneFace>>;

// The file and face index fontconfig gives for the family. The configuration is the process's own
// copy, made and destroyed here: the one Tk's Xft uses stays untouched, and nothing of this lookup
// outlives it.
bool FindFace(const char* family, double pixels, std::string& file, int& index, std::string& why) {
    const ConfigPtr config(FcInitLoadConfigAndFonts());
    if (!config) {
        why = "fontconfig has no configuration";
        return false;
    }
    const PatternPtr request(FcPatternCreate());
    if (!request || !FcPatternAddString(request.get(), FC_FAMILY, reinterpret_cast<const FcChar8*>(family)) ||
        !FcPatternAddBool(request.get(), FC_SCALABLE, FcTrue) || !FcPatternAddDouble(request.get(), FC_PIXEL_SIZE, pixels)) {
        why = "out of memory";
        return false;
    }
    FcConfigSubstitute(config.get(), request.get(), FcMatchPattern);
    FcDefaultSubstitute(request.get());
    FcResult result = FcResultNoMatch;
    const PatternPtr match(FcFontMatch(config.get(), request.get(), &result));
    FcChar8* path = nullptr;
    if (!match || FcPatternGetString(match.get(), FC_FILE, 0, &path) != FcResultMatch || path == nullptr) {
        why = std::string("fontconfig knows no font for ") + family;
        return false;
    }
    file = reinterpret_cast<const char*>(path);
    if (FcPatternGetInteger(match.get(), FC_INDEX, 0, &index) != FcResultMatch) index = 0;
    return true;
}

}  // namespace

struct LabelFont::Face {
    LibraryPtr library;  // declared first, so released after the face
    FacePtr face;
    std::unordered_map<char32_t, Glyph> glyphs;
};

LabelFont::LabelFont(std::unique_ptr<Face> face) : m_face(std::move(face)) {}
LabelFont::~LabelFont() = default;

std::unique_ptr<LabelFont> LabelFont::Open(const char* family, double pixels, std::string& why) {
    std::string file;
    int index = 0;
    if (!FindFace(family, pixels, file, index, why)) return nullptr;
    auto face = std::make_unique<Face>();
    FT_Library library = nullptr;
    if (FT_Init_FreeType(&library) != 0) {
        why = "FreeType cannot start";
        return nullptr;
    }
    face->library.reset(library);
    FT_Face loaded = nullptr;
    if (FT_New_Face(library, file.c_str(), index, &loaded) != 0) {
        why = "FreeType cannot load " + file;
        return nullptr;
    }
    face->face.reset(loaded);
    // A bitmap face has only the sizes it was drawn at; the labels need theirs.
    if (!FT_IS_SCALABLE(loaded) ||
        FT_Set_Pixel_Sizes(loaded, 0, static_cast<FT_UInt>(std::lround(pixels))) != 0) {
        why = file + " has no outlines to draw at " + std::to_string(std::lround(pixels)) + " pixels";
        return nullptr;
    }
    return std::unique_ptr<LabelFont>(new LabelFont(std::move(face)));
}

const LabelFont::Glyph& LabelFont::GlyphOf(char32_t character) {
    auto [it, added] = m_face->glyphs.try_emplace(character);
    Glyph& glyph = it->second;
    if (!added) return glyph;
    FT_Face face = m_face->face.get();
    // A character the face lacks, or one it cannot render, moves the pen and draws nothing.
    if (FT_Load_Char(face, character, FT_LOAD_RENDER) != 0) return glyph;
    const FT_GlyphSlot slot = face->glyph;
    glyph.advance = slot->advance.x / 64;
    const FT_Bitmap& bitmap = slot->bitmap;
    if (bitmap.pixel_mode != FT_PIXEL_MODE_GRAY || bitmap.buffer == nullptr) return glyph;
    glyph.left = slot->bitmap_left;
    glyph.top = slot->bitmap_top;
    glyph.width = static_cast<int>(bitmap.width);
    glyph.rows = static_cast<int>(bitmap.rows);
    glyph.coverage.resize(std::size_t(glyph.width) * std::size_t(glyph.rows));
    // A row of the bitmap is `pitch` bytes apart, and the rows run upwards when it is negative.
    for (int row = 0; row < glyph.rows; ++row) {
        const unsigned char* from = bitmap.pitch >= 0 ? bitmap.buffer + std::ptrdiff_t(row) * bitmap.pitch
                                                      : bitmap.buffer - std::ptrdiff_t(glyph.rows - 1 - row) * bitmap.pitch;
        std::memcpy(&glyph.coverage[std::size_t(row) * std::size_t(glyph.width)], from, std::size_t(glyph.width));
    }
    return glyph;
}

long LabelFont::Advance(std::u32string_view text) {
    long pen = 0;
    for (const char32_t c : text) pen += GlyphOf(c).advance;
    return pen;
}

std::u32string LabelText(std::string_view utf8) {
    std::u32string out;
    out.reserve(utf8.size());
    std::size_t i = 0;
    while (i < utf8.size()) {
        const unsigned char lead = static_cast<unsigned char>(utf8[i]);
        const int more = lead < 0x80 ? 0 : (lead & 0xe0) == 0xc0 ? 1 : (lead & 0xf0) == 0xe0 ? 2 : (lead & 0xf8) == 0xf0 ? 3 : -1;
        char32_t c = more == 0 ? lead : more == 1 ? lead & 0x1f : more == 2 ? lead & 0x0f : lead & 0x07;
        bool ok = more >= 0 && i + std::size_t(more) < utf8.size();
        for (int k = 1; ok && k <= more; ++k) {
            const unsigned char next = static_cast<unsigned char>(utf8[i + std::size_t(k)]);
            ok = (next & 0xc0) == 0x80;
            c = (c << 6) | (next & 0x3f);
        }
        // Overlong forms, surrogates and values past Unicode are no characters either.
        static constexpr char32_t kLeast[] = {0, 0x80, 0x800, 0x10000};
        ok = ok && c >= kLeast[more] && c <= 0x10ffff && (c < 0xd800 || c > 0xdfff);
        if (!ok) {
            out += U'\ufffd';
            ++i;
            continue;
        }
        out += c < 0x20 ? (c == '\t' || c == '\n' || c == '\r' ? U' ' : U'?') : c;
        i += std::size_t(more) + 1;
    }
    return out;
}

}  // namespace kelmartool
