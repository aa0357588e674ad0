// Faces between threads: layouts measure and shape, a preload fetches shapes and a frame is painted, all with
// the same faces, while other fonts come in. Run under ThreadSanitizer too.
#include <gtest/gtest.h>

#include <atomic>
#include <thread>

#include "fresco/font_files.h"

namespace fresco::test {
namespace {

// A code of many pages of a glyph table.
uint32_t CodeOf(uint32_t i) {
    constexpr uint32_t kStarts[] = {'A', 0xC0, 0x391, 0x410, 0x5D0, 0x620, 0x2190, 0x2588, 0x4E00, 0x1F600};
    return kStarts[i % std::size(kStarts)] + i % 23;
}

// What layout asks of a font; the same for the same turn.
float Measure(const IFont& font, uint32_t turn) {
    uint32_t codes[8], glyphs[8];
    float advances[8], sum = font.GetMetrics(20).ascent;
    for (uint32_t i = 0; i < 8; ++i)
        codes[i] = CodeOf(turn * 8 + i);
    font.GetGlyphIndices(codes, 8, glyphs);
    font.GetAdvances(glyphs, 8, 20, advances);
    for (const float advance : advances)
        sum += advance;
    GlyphSink sink;
    ShapeRequest request;
    request.codePoints = codes, request.count = 8, request.size = 20;
    request.direction = turn % 2 ? TextDirection::RightToLeft : TextDirection::LeftToRight;
    font.Shape(request, sink);
    for (const ShapedGlyph& glyph : sink.glyphs)
        sum += glyph.advance;
    font.PreloadGlyphs(codes, 8);
    return sum;
}

TEST(Faces, ThreadsShareThemAndSeeTheSame) {
    constexpr uint32_t kThreads = 4, kTurns = 120;
    const Bytes file = ReadFile(kSans);
    if (file.empty()) GTEST_SKIP() << "no DejaVu on this machine";
    Canvas canvas;
    IFontService& service = *canvas.library->GetFontService();
    // So few that runs are thrown away while others read them.
    FontServiceConfiguration configuration;
    configuration.keptGlyphs = 256;
    service.Configure(&configuration);
    const FontId plain = Load(service, file), field = Load(service, file, SdfMode::Always);
    std::vector<float> sums(kThreads * kTurns);
    std::vector<std::thread> threads;
    for (uint32_t t = 0; t < kThreads; ++t) {
        threads.emplace_back([&, t] {
            for (uint32_t i = 0; i < kTurns; ++i) {
                sums[t * kTurns + i] = Measure(*service.GetFont((i + t) % 2 ? plain : field), i);
                service.FindFont("nothing", 0);
            }
        });
    }
    threads.emplace_back([&] {
        for (int i = 0; i < 3; ++i)
            EXPECT_NE(Load(service, file), kNoId);
    });
    for (int frame = 0; frame < 10; ++frame) {
        DrawText(canvas, plain, "ABCabc", 20, 20);
        DrawText(canvas, field, "ABCabc", 20, 50);
    }
    for (std::thread& thread : threads)
        thread.join();
    // As one thread alone sees them.
    for (uint32_t i = 0; i < kTurns; ++i) {
        const float alone = Measure(*service.GetFont(plain), i);
        for (uint32_t t = 0; t < kThreads; ++t)
            EXPECT_EQ(sums[t * kTurns + i], alone) << t << " " << i;
    }
}

}  // namespace
}  // namespace fresco::test
