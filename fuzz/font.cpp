// Font files through the whole text path: opened, measured, shaped and drawn by the rendering library alone,
// then as the @font-face of a page whose texts are laid out, recorded and painted.
#include <algorithm>
#include <cmath>
#include <cstring>

#include <fresco/library.h>

#include "support/engine.h"
#include "support/memory_file.h"
#include "support/scene.h"
#include "support/text_page.h"

namespace qorvex::fuzz {
namespace {

using namespace fresco;

constexpr uint32_t kText[] = {'A',   'V',   'f',   'i',   0x301,  ' ',     0x5D0,    0x644,
                              0x627, 0x915, 0x94D, 0x937, 0x4E00, 0x1F600, 0x10FFFF, 0};
constexpr const char* kUtf8 = "AVfi e\u0301 \u0644\u0627 \u4E00 \U0001F600";
constexpr uint32_t kMostFaces = 3;

struct Specimen {
    const char* text;
    const char* style;
};
// Several scripts, and each way to break, cut, align and fit lines.
constexpr Specimen kSpecimens[] = {
    {"AVfi 12 office, words that wrap", "text-align: justify; text-shadow: 1px 1px 2px red"},
    {"\u0633\u0644\u0627\u0645 12 \u05E9\u05DC\u05D5\u05DD AV", "overflow-wrap: break-word"},
    {"\u0915\u094D\u0937\u093F \u0E01\u0E33\u0E25\u0E31\u0E07", "text-align: center"},
    {"\u6F22\u5B57\u304B\u306A \uD55C\uAD6D", "overflow-wrap: anywhere"},
    {"\U0001F469\u200D\U0001F4BB\U0001F1E9\U0001F1EA\U0001F44D\U0001F3FD",
     "font-size: 40px; qor-font-sdf: on"},
    {"\u0301e\u0301\u0302 \u202E\u2067x\u2069", "white-space: pre-wrap"},
    {"cut off where the box ends", "white-space: nowrap; text-overflow: ellipsis"},
    {"fits", "font-fit-mode: shrink; white-space: nowrap; text-align: right; font-size: 90px"},
};

struct CheckShape final : IShapeSink {
    void OnGlyphs(const ShapedGlyph* glyphs, size_t count) override {
        for (size_t i = 0; i < count; ++i) {
            Require(glyphs[i].cluster < std::size(kText), "a glyph of no character");
            Require(std::isfinite(glyphs[i].advance), "an advance that is no number");
        }
    }
};

void Measure(IFont& font, float size) {
    const FontMetrics metrics = font.GetMetrics(size);
    Require(std::isfinite(metrics.ascent) && std::isfinite(metrics.descent), "metrics that are no numbers");
    uint32_t glyphs[std::size(kText)];
    float advances[std::size(kText)];
    font.GetGlyphIndices(kText, std::size(kText), glyphs);
    if (font.GetAdvances(glyphs, std::size(kText), size, advances))
        for (const float advance : advances)
            Require(std::isfinite(advance), "an advance that is no number");
    CheckShape sink;
    for (const auto direction : {TextDirection::LeftToRight, TextDirection::RightToLeft}) {
        ShapeRequest request;
        request.codePoints = kText;
        request.count = std::size(kText);
        request.size = size;
        request.direction = direction;
        (void)font.Shape(request, sink);
    }
}

void ShowPage(const uint8_t* data, size_t size) {
    const Input input;
    Scene scene;
    TextPage page(scene, data, size);
    for (const Specimen& specimen : kSpecimens)
        page.AddText(specimen.text, specimen.style);
    page.AddParagraph("AV \u0644\u0627 \u4E00");
    page.Show();
}

void Use(Scene& scene, MemoryFile& file, uint32_t face, SdfMode sdf) {
    const FontId id = scene.library().GetFontService()->LoadFace(&file, face, sdf);
    IFont* font = id == kNoId ? nullptr : scene.library().GetFontService()->GetFont(id);
    if (!font) return;
    Require(font->GetFamilyName() != nullptr, "a font without a name");
    font->PreloadText(kUtf8, std::strlen(kUtf8));
    CommandBuffer* buffer = Library::CreateBuffer(0, 0);
    for (const float size : {0.5f, 13.f, 90.f}) {
        Measure(*font, size);
        TextPaint text;
        text.font = id;
        text.size = size;
        text.y = 40;
        text.paint.color = {1, 0, 0, 0};
        buffer->FillString(kUtf8, std::strlen(kUtf8), text);
    }
    scene.Draw(buffer);
}

}  // namespace
}  // namespace qorvex::fuzz

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    using namespace qorvex::fuzz;
    {
        Scene scene;
        MemoryFile file(data, size);
        const uint32_t faces = std::min(scene.library().GetFontService()->GetFaceCount(&file), kMostFaces);
        for (uint32_t face = 0; face <= faces; ++face)
            Use(scene, file, face, face % 2 ? fresco::SdfMode::Always : fresco::SdfMode::Never);
    }
    ShowPage(data, size);
    return 0;
}
