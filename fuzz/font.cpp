// Font files through the text path of the rendering library: open, measure, shape, draw plain and as a
// distance field.
#include <algorithm>
#include <cmath>
#include <cstring>

#include <fresco/library.h>
#include <fresco/stream_reader.h>

#include "support/engine.h"
#include "support/scene.h"

namespace qorvex::fuzz {
namespace {

using namespace fresco;

constexpr uint32_t kText[] = {'A',   'V',   'f',   'i',   0x301,  ' ',     0x5D0,    0x644,
                              0x627, 0x915, 0x94D, 0x937, 0x4E00, 0x1F600, 0x10FFFF, 0};
constexpr const char* kUtf8 = "AVfi e\u0301 \u0644\u0627 \u4E00 \U0001F600";
constexpr uint32_t kMostFaces = 3;

class FileInMemory final : public IStreamReader {
  public:
    FileInMemory(const uint8_t* data, size_t size) : data_(data), size_(size) {}
    size_t GetSize() override { return size_; }
    size_t Read(size_t offset, void* destination, size_t size) override {
        size = offset < size_ ? std::min(size, size_ - offset) : 0;
        if (size) std::memcpy(destination, data_ + offset, size);
        return size;
    }
    void Close() override {}

  private:
    const uint8_t* data_;
    size_t size_;
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

void Use(Scene& scene, FileInMemory& file, uint32_t face, SdfMode sdf) {
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
    Scene scene;
    FileInMemory file(data, size);
    const uint32_t faces = std::min(scene.library().GetFontService()->GetFaceCount(&file), kMostFaces);
    for (uint32_t face = 0; face <= faces; ++face)
        Use(scene, file, face, face % 2 ? fresco::SdfMode::Always : fresco::SdfMode::Never);
    return 0;
}
